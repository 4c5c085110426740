#include "CommandLine.h"

#include <CLI/CLI.hpp>

#include <algorithm>
#include <charconv>
#include <cstdint>
#include <map>
#include <memory>
#include <ostream>
#include <sstream>
#include <string>
#include <string_view>
#include <tuple>
#include <vector>

#include "VtrVersion.h"
#include "engine/Messages.h"

namespace vtr::cli {
namespace {

constexpr const char* kProgram = "vantori-verify";

// Help is written for 80 columns, option names on the left, descriptions from this column.
constexpr std::size_t kHelpWidth = 80;
constexpr std::size_t kNameColumn = 26;
// The most processors --jobs takes.
constexpr int kMaxJobs = 256;

const char* const kDescription =
    "Checks a Vantori show-lighting installation before the show runs: settings, schedules, "
    "shows, sequences, channel conflicts and network usage. It never changes a file of the "
    "suite.";

const char* const kUsage =
    "Usage:\n"
    "  vantori-verify --schedule | --show FILE | --sequence FILE  [options]\n"
    "  vantori-verify ignore --message N | --key KEY\n"
    "  vantori-verify unignore --message N | --key KEY\n"
    "  vantori-verify ignored\n"
    "\n";

const char* const kFooter =
    "Examples:\n"
    "  vantori-verify --schedule\n"
    "  vantori-verify --schedule --severity error\n"
    "  vantori-verify --schedule --group-by pair --statistics\n"
    "  vantori-verify --show Evening.lss --format json --output evening.json\n"
    "  vantori-verify --schedule --output report.html\n"
    "  vantori-verify --schedule --fail-on error --baseline last.json --write-baseline "
    "last.json\n"
    "  vantori-verify ignore --message 43\n"
    "\n"
    "Exit status: 0 when no warning or error was found (ignored results do not count), 1 when "
    "warnings but no errors were found, 2 when errors were found (--fail-on and --baseline "
    "change which findings count), 3 when the target, the settings store, the report or the "
    "baseline cannot be set up or written, 64 for wrong usage, 130 when the run was cancelled.\n"
    "\n"
    "The settings store is the file named by --registry, else by VANTORI_REGISTRY, else the "
    "per-user default. The verification never changes a file of the suite.";

// The words of a text on lines of at most `width` characters; line breaks in the text stay.
std::string Wrap(const std::string& text, std::size_t width) {
    std::string wrapped;
    std::istringstream paragraphs(text);
    bool firstParagraph = true;
    for (std::string paragraph; std::getline(paragraphs, paragraph);) {
        if (!firstParagraph)
            wrapped += '\n';
        firstParagraph = false;
        // A line that starts with blanks (an example, a usage line) is kept as it is.
        if (paragraph.starts_with(" ")) {
            wrapped += paragraph;
            continue;
        }
        std::istringstream words(paragraph);
        std::size_t column = 0;
        for (std::string word; words >> word;) {
            if (column > 0 && column + 1 + word.size() > width) {
                wrapped += '\n';
                column = 0;
            } else if (column > 0) {
                wrapped += ' ';
                ++column;
            }
            wrapped += word;
            column += word.size();
        }
    }
    return wrapped;
}

// Help in plain words: an option shows the name of its value ("--show FILE") and its
// description, never the parser's notes on types, checks or exclusions. Each command's usage
// lines come from here.
class HelpFormatter : public CLI::Formatter {
  public:
    HelpFormatter() { column_width(kNameColumn); }

    void SetUsage(const CLI::App* app, std::string usage) { usages_[app] = std::move(usage); }

    std::string make_description(const CLI::App* app) const override {
        return Wrap(app->get_description(), kHelpWidth) + "\n\n";
    }
    std::string make_usage(const CLI::App* app, std::string) const override {
        const auto found = usages_.find(app);
        return found == usages_.end() ? std::string() : found->second;
    }
    std::string make_group(std::string group, bool positional,
                           std::vector<const CLI::Option*> options) const override {
        // One blank line between groups (the caller puts it there), not two.
        std::string text = group + ":\n";
        for (const CLI::Option* option : options)
            text += make_option(option, positional);
        return text;
    }
    std::string make_footer(const CLI::App* app) const override {
        return app->get_footer().empty() ? std::string()
                                         : Wrap(app->get_footer(), kHelpWidth) + "\n";
    }
    std::string make_option_opts(const CLI::Option* option) const override {
        if (option->get_type_size() == 0 || option->get_type_name().empty())
            return {};
        return " " + option->get_type_name();
    }
    std::string make_option_name(const CLI::Option* option, bool positional) const override {
        // "-q,--quiet" reads better as "-q, --quiet".
        std::string name;
        for (const char c : CLI::Formatter::make_option_name(option, positional))
            name += c == ',' ? std::string(", ") : std::string(1, c);
        return name;
    }
    std::string make_option_desc(const CLI::Option* option) const override {
        return Wrap(option->get_description(), kHelpWidth - kNameColumn);
    }
    std::string make_subcommand(const CLI::App* command) const override {
        // The command's first sentence in the list of commands; the whole in its own help.
        const std::string& description = command->get_description();
        const std::size_t end = description.find(". ");
        std::ostringstream out;
        CLI::detail::format_help(
            out, command->get_name(),
            end == std::string::npos ? description : description.substr(0, end + 1), column_width_);
        return out.str();
    }

  private:
    std::map<const CLI::App*, std::string> usages_;
};

void Usage(std::ostream& err, const std::string& reason) {
    err << kProgram << ": " << reason << "\n"
        << "Run with --help for more information.\n";
}

std::string Quoted(const std::string& text) {
    return "\"" + text + "\"";
}

// "a, b or c".
std::string Alternatives(const std::vector<std::string>& words, const std::string& last) {
    std::string text;
    for (std::size_t i = 0; i < words.size(); ++i) {
        if (i > 0)
            text += i + 1 == words.size() ? " " + last + " " : ", ";
        text += words[i];
    }
    return text;
}

char Lower(char c) {
    return c >= 'A' && c <= 'Z' ? static_cast<char>(c - 'A' + 'a') : c;
}

// The number of single-letter edits (insertions, deletions, changes, swaps of neighbours)
// between two words, without regard to letter case.
std::size_t EditDistance(const std::string& a, const std::string& b) {
    std::vector<std::vector<std::size_t>> d(a.size() + 1, std::vector<std::size_t>(b.size() + 1));
    for (std::size_t i = 0; i <= a.size(); ++i)
        d[i][0] = i;
    for (std::size_t j = 0; j <= b.size(); ++j)
        d[0][j] = j;
    for (std::size_t i = 1; i <= a.size(); ++i) {
        for (std::size_t j = 1; j <= b.size(); ++j) {
            const std::size_t change = Lower(a[i - 1]) == Lower(b[j - 1]) ? 0 : 1;
            d[i][j] = std::min({d[i - 1][j] + 1, d[i][j - 1] + 1, d[i - 1][j - 1] + change});
            if (i > 1 && j > 1 && Lower(a[i - 1]) == Lower(b[j - 2]) &&
                Lower(a[i - 2]) == Lower(b[j - 1]))
                d[i][j] = std::min(d[i][j], d[i - 2][j - 2] + 1);
        }
    }
    return d[a.size()][b.size()];
}

// The word a mistyped one was most likely meant to be: one or two letters off (one for short
// words), or the start of exactly one of them.
std::optional<std::string> Nearest(const std::string& typed,
                                   const std::vector<std::string>& words) {
    std::optional<std::string> best;
    std::size_t bestDistance = 0;
    for (const std::string& word : words) {
        const std::size_t distance = EditDistance(typed, word);
        if (distance <= (word.size() >= 6 ? 2u : 1u) && (!best || distance < bestDistance)) {
            best = word;
            bestDistance = distance;
        }
    }
    if (best)
        return best;
    const std::string bare = typed.substr(typed.find_first_not_of('-') == std::string::npos
                                              ? typed.size()
                                              : typed.find_first_not_of('-'));
    if (bare.size() < 3)
        return std::nullopt;
    std::vector<std::string> starting;
    for (const std::string& word : words) {
        if (word.size() > typed.size() && word.starts_with(typed))
            starting.push_back(word);
    }
    if (starting.size() == 1)
        return starting.front();
    return std::nullopt;
}

// The long names of an app's options ("--schedule"), and its commands' names.
std::vector<std::string> OptionNames(const CLI::App& app) {
    std::vector<std::string> names;
    for (const CLI::Option* option : app.get_options()) {
        for (const std::string& name : option->get_lnames())
            names.push_back("--" + name);
    }
    return names;
}

std::string UnknownArgument(const std::string& argument, const CLI::App& app,
                            const CLI::App* command) {
    if (argument.starts_with("-")) {
        const std::string name = argument.substr(0, argument.find('='));
        std::vector<std::string> candidates = OptionNames(app);
        if (command != nullptr) {
            for (const std::string& own : OptionNames(*command))
                candidates.push_back(own);
        }
        // An option of the ignore commands given without one.
        std::vector<std::string> owners;
        for (const CLI::App* sub : app.get_subcommands({})) {
            const std::vector<std::string> own = OptionNames(*sub);
            if (command == nullptr && std::find(own.begin(), own.end(), name) != own.end())
                owners.push_back(Quoted(sub->get_name()));
        }
        if (!owners.empty())
            return name + " is an option of " + Alternatives(owners, "and") + ", e.g. " + kProgram +
                   " " + owners.front().substr(1, owners.front().size() - 2) + " " + name + " ...";
        std::string text = "unknown option " + name;
        if (const auto nearest = Nearest(name, candidates))
            text += "; did you mean " + *nearest + "?";
        return text;
    }
    if (command != nullptr)
        return "unexpected argument " + Quoted(argument);
    std::vector<std::string> commands;
    for (const CLI::App* sub : app.get_subcommands({}))
        commands.push_back(sub->get_name());
    if (const auto nearest = Nearest(argument, commands))
        return "unknown command " + Quoted(argument) + "; did you mean " + Quoted(*nearest) + "?";
    return "unexpected argument " + Quoted(argument) +
           " (a file to verify follows --show or --sequence)";
}

// The value of an option that takes one of a few words, or the reason it is not one.
template <class Value>
std::optional<std::string> Choose(const std::string& option, const std::string& given,
                                  const std::vector<std::pair<std::string, Value>>& choices,
                                  Value& chosen) {
    std::string lower;
    for (const char c : given)
        lower += Lower(c);
    std::vector<std::string> words;
    for (const auto& [word, value] : choices) {
        if (lower == word) {
            chosen = value;
            return std::nullopt;
        }
        words.push_back(word);
    }
    std::string reason = option + " takes " + Alternatives(words, "or") + ", not " + Quoted(given);
    if (const auto nearest = Nearest(given, words))
        reason += "; did you mean " + *nearest + "?";
    return reason;
}

// A whole decimal number, or nothing.
std::optional<int64_t> WholeNumber(const std::string& text) {
    int64_t value = 0;
    const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), value);
    if (text.empty() || error != std::errc() || end != text.data() + text.size())
        return std::nullopt;
    return value;
}

bool InCatalog(int64_t number) {
    return std::any_of(std::begin(Messages::kAll), std::end(Messages::kAll),
                       [&](const Message& message) { return message.number == number; });
}

// The options that the two ignore subcommands share.
struct IgnoreArguments {
    std::string message;
    std::string key;
    CLI::Option* messageOption = nullptr;
    CLI::Option* keyOption = nullptr;
};

CLI::App* AddIgnoreCommand(CLI::App& app, HelpFormatter& help, const std::string& name,
                           const std::string& description, const std::string& messageHelp,
                           IgnoreArguments& arguments) {
    CLI::App* command = app.add_subcommand(name, description);
    // Options of the whole program (--registry, --format) may follow the command's name.
    command->fallthrough();
    command->set_help_flag();
    arguments.messageOption =
        command->add_option("--message", arguments.message, messageHelp)->type_name("N");
    arguments.keyOption =
        command
            ->add_option("--key", arguments.key,
                         "one result, by its key: the message number, \"-\", then each detail "
                         "followed by \" / \" (the last \" / \" may be left out). \"vantori-verify "
                         "ignored\" and --format json show the keys; give a key that begins "
                         "\"escaped:\" as it is shown.")
            ->type_name("KEY");
    for (CLI::Option* option : {arguments.messageOption, arguments.keyOption})
        option->multi_option_policy(CLI::MultiOptionPolicy::TakeLast);
    command->set_help_flag("-h,--help", "show this help");
    command->group("Commands");
    help.SetUsage(command, "Usage:\n  vantori-verify " + name +
                               " --message N | --key KEY  [--registry FILE]\n\n");
    command->footer("Examples:\n  vantori-verify " + name + " --message 43\n  vantori-verify " +
                    name +
                    " --key \"28-[SEQUENCE]: /home/me/Snowfall.las / [TRACK]: Track 1: Garage "
                    "/ [CHANNEL]: Star\"");
    return command;
}

// What an error of the parser means, in plain words.
std::string PlainReason(const CLI::ParseError& error) {
    std::string what = error.what();
    // "--show: 1 required FILE missing": an option without its value.
    const std::size_t colon = what.find(": ");
    if (dynamic_cast<const CLI::ArgumentMismatch*>(&error) != nullptr &&
        colon != std::string::npos && what.find(" missing") != std::string::npos) {
        const std::string option = what.substr(0, colon);
        const std::size_t required = what.find("required ", colon);
        const std::string value =
            required == std::string::npos
                ? "a value"
                : what.substr(required + 9, what.find(' ', required + 9) - required - 9);
        return option + " needs a value: " + option + " " + value;
    }
    return what;
}

}  // namespace

const char* TargetKindName(TargetKind kind) {
    switch (kind) {
        case TargetKind::Schedule:
            return "schedule";
        case TargetKind::Show:
            return "show";
        case TargetKind::Sequence:
            return "sequence";
    }
    return "schedule";
}

std::string CatalogRanges() {
    std::vector<std::string> ranges;
    const auto& all = Messages::kAll;
    for (std::size_t i = 0; i < std::size(all);) {
        std::size_t last = i;
        while (last + 1 < std::size(all) && all[last + 1].number == all[last].number + 1)
            ++last;
        ranges.push_back(last == i ? std::to_string(all[i].number)
                                   : std::to_string(all[i].number) + "-" +
                                         std::to_string(all[last].number));
        i = last + 1;
    }
    return Alternatives(ranges, "and");
}

ParseOutcome ParseCommandLine(int argc, const char* const* argv, std::ostream& out,
                              std::ostream& err) {
    CLI::App app{kDescription, kProgram};
    auto help = std::make_shared<HelpFormatter>();
    app.formatter(help);
    help->SetUsage(&app, kUsage);
    app.footer(kFooter);
    // Listed after the other options: it is added again below.
    app.set_help_flag();
    // Unknown arguments are collected and explained below, with a suggestion.
    app.allow_extras();

    bool schedule = false;
    std::string show;
    std::string sequence;
    std::string registry;
    std::string format = "text";
    std::string output;
    bool log = false;
    bool quiet = false;
    std::string severity = "info";
    std::string failOn = "warning";
    std::string groupBy = "none";
    bool statistics = false;
    std::string color = "auto";
    std::string baseline;
    std::string writeBaseline;
    std::string jobs;

    const std::string target = "What to verify";
    const std::string triage = "Finding what matters";
    const std::string output_ = "Output";
    const std::string nightly = "Nightly checks";
    const std::string speed = "Speed";
    const std::string store = "Settings";

    CLI::Option* scheduleOption =
        app.add_flag("--schedule", schedule,
                     "the weekly and calendar schedules, with every show and sequence they play")
            ->group(target);
    CLI::Option* showOption = app.add_option("--show", show, "one show file and its sequences")
                                  ->type_name("FILE")
                                  ->group(target);
    CLI::Option* sequenceOption = app.add_option("--sequence", sequence, "one sequence file")
                                      ->type_name("FILE")
                                      ->group(target);

    CLI::Option* severityOption =
        app.add_option("--severity", severity,
                       "list only results of this severity and worse: error, warning or info "
                       "(the default). The summary says how many were left out; the exit "
                       "status still counts them.")
            ->type_name("LEVEL")
            ->group(triage);
    CLI::Option* groupByOption =
        app.add_option("--group-by", groupBy,
                       "list the results under headings with counts: message, show, sequence "
                       "or pair (the two sequences of a channel conflict)")
            ->type_name("WHAT")
            ->group(triage);
    CLI::Option* statisticsOption =
        app.add_flag("--statistics", statistics,
                     "instead of every result, one line per message number with its count, "
                     "most frequent first; with --group-by, the largest groups too")
            ->group(triage);
    CLI::Option* failOnOption =
        app.add_option("--fail-on", failOn,
                       "which findings make the exit status non-zero: warning (the default: 1 "
                       "for warnings, 2 for errors), error (warnings alone give 0) or never")
            ->type_name("LEVEL")
            ->group(triage);

    app.add_option("--format", format,
                   "text (the default); json: one JSON document with every result; html: "
                   "the report to read in a browser, with the week at a glance; sarif: for "
                   "tools that gather the findings of many checkers")
        ->type_name("FORMAT")
        ->group(output_);
    CLI::Option* outputOption =
        app.add_option("--output", output,
                       "also save the results report, in the format the name's extension asks "
                       "for: .json, .html, .sarif, any other the text report")
            ->type_name("FILE")
            ->group(output_);
    CLI::Option* colorOption =
        app.add_option("--color,--colour", color,
                       "colour the results by severity: auto (the default: on a terminal, "
                       "unless NO_COLOR is set), always or never")
            ->type_name("WHEN")
            ->group(output_);
    CLI::Option* logOption =
        app.add_flag("--log", log, "write the output log to standard error as the run goes")
            ->group(output_);
    CLI::Option* quietOption =
        app.add_flag("-q,--quiet", quiet, "no progress line on a terminal")->group(output_);

    CLI::Option* baselineOption =
        app.add_option("--baseline", baseline,
                       "list only the results whose keys are not in this baseline file; the "
                       "exit status comes from them alone")
            ->type_name("FILE")
            ->group(nightly);
    CLI::Option* writeBaselineOption =
        app.add_option("--write-baseline", writeBaseline,
                       "save the keys of this run's results as a baseline file (it may be the "
                       "--baseline file)")
            ->type_name("FILE")
            ->group(nightly);

    CLI::Option* jobsOption =
        app.add_option("--jobs", jobs,
                       "load sequence files on N processors at once (the default: every "
                       "processor of the machine; 1 loads them one after another). The results "
                       "are the same whatever N.")
            ->type_name("N")
            ->group(speed);

    CLI::Option* registryOption =
        app.add_option("--registry", registry,
                       "the settings store file (else VANTORI_REGISTRY, else the per-user "
                       "store)")
            ->type_name("FILE")
            ->group(store);
    app.set_help_flag("-h,--help", "show this help")->group(store);
    app.set_version_flag("--version", std::string(kProgram) + " " + kVersionText,
                         "show the program's version")
        ->group(store);
    for (CLI::Option* option : app.get_options())
        option->multi_option_policy(CLI::MultiOptionPolicy::TakeLast);

    IgnoreArguments ignoreArguments;
    IgnoreArguments unignoreArguments;
    CLI::App* ignore = AddIgnoreCommand(
        app, *help, "ignore",
        "Ignore results in later verifications. Every result with a message number, or one "
        "result by its key, is left out of the counts and the exit status from then on. The "
        "ignore lists are kept in the settings store, where the window reads them too.",
        "every result with this message number: " + CatalogRanges(), ignoreArguments);
    CLI::App* unignore = AddIgnoreCommand(
        app, *help, "unignore",
        "Stop ignoring results. Any number or key can be removed from the lists, also one that "
        "no result carries any more.",
        "the results with this message number", unignoreArguments);
    CLI::App* ignored = app.add_subcommand(
        "ignored",
        "List both ignore lists. The keys are in double quotes, so that their trailing blank "
        "shows; --format json prints them as one JSON object.");
    ignored->fallthrough();
    ignored->group("Commands");
    ignored->footer("Examples:\n  vantori-verify ignored\n  vantori-verify ignored --format json");
    help->SetUsage(ignored,
                   "Usage:\n  vantori-verify ignored  [--format json] [--registry FILE]\n\n");
    app.require_subcommand(0, 1);

    try {
        app.parse(argc, argv);
    } catch (const CLI::CallForHelp& error) {
        app.exit(error, out, err);
        return ParseOutcome{std::nullopt, ExitStatus::Clean};
    } catch (const CLI::CallForVersion& error) {
        app.exit(error, out, err);
        return ParseOutcome{std::nullopt, ExitStatus::Clean};
    } catch (const CLI::ParseError& error) {
        Usage(err, PlainReason(error));
        return ParseOutcome{std::nullopt, ExitStatus::Usage};
    }

    CLI::App* chosen = nullptr;
    for (CLI::App* command : {ignore, unignore, ignored}) {
        if (command->parsed())
            chosen = command;
    }
    if (const std::vector<std::string> extras = app.remaining(true); !extras.empty()) {
        Usage(err, UnknownArgument(extras.front(), app, chosen));
        return ParseOutcome{std::nullopt, ExitStatus::Usage};
    }

    Options options;
    if (registryOption->count() > 0)
        options.registry = registry;
    if (auto reason = Choose<OutputFormat>("--format", format,
                                           {{"text", OutputFormat::Text},
                                            {"json", OutputFormat::Json},
                                            {"html", OutputFormat::Html},
                                            {"sarif", OutputFormat::Sarif}},
                                           options.format)) {
        Usage(err, *reason);
        return ParseOutcome{std::nullopt, ExitStatus::Usage};
    }
    if (chosen == ignored && options.format != OutputFormat::Text &&
        options.format != OutputFormat::Json) {
        Usage(err, "\"ignored\" lists the ignore lists as text or json, not " + format + "; the " +
                       format + " report is a verification's");
        return ParseOutcome{std::nullopt, ExitStatus::Usage};
    }

    if (chosen != nullptr) {
        std::vector<std::string> verifyOnly;
        for (CLI::Option* option :
             {scheduleOption, showOption, sequenceOption, outputOption, logOption, quietOption,
              severityOption, groupByOption, statisticsOption, failOnOption, colorOption,
              baselineOption, writeBaselineOption, jobsOption}) {
            if (option->count() > 0)
                verifyOnly.push_back("--" + option->get_lnames().front());
        }
        if (!verifyOnly.empty()) {
            Usage(err, Quoted(chosen->get_name()) + " cannot be combined with " +
                           Alternatives(verifyOnly, "or") +
                           (verifyOnly.size() == 1 ? ", an option of a verification"
                                                   : ", options of a verification"));
            return ParseOutcome{std::nullopt, ExitStatus::Usage};
        }
        if (chosen == ignored) {
            options.command = Command::ListIgnored;
            return ParseOutcome{options, ExitStatus::Clean};
        }
        const IgnoreArguments& arguments = chosen == ignore ? ignoreArguments : unignoreArguments;
        options.command = chosen == ignore ? Command::Ignore : Command::Unignore;
        const bool message = arguments.messageOption->count() > 0;
        const bool key = arguments.keyOption->count() > 0;
        if (message == key) {
            Usage(err, Quoted(chosen->get_name()) +
                           (message ? " takes either --message N or --key KEY, not both"
                                    : " needs --message N or --key KEY"));
            return ParseOutcome{std::nullopt, ExitStatus::Usage};
        }
        if (key) {
            options.ignoreKey = arguments.key;
            return ParseOutcome{options, ExitStatus::Clean};
        }
        const std::optional<int64_t> number = WholeNumber(arguments.message);
        if (!number) {
            Usage(err, "--message takes a message number, not " + Quoted(arguments.message));
            return ParseOutcome{std::nullopt, ExitStatus::Usage};
        }
        // Ignoring needs a message that exists; any number can be un-ignored, so that an
        // entry no result matches any more can still be removed.
        if (chosen == ignore && !InCatalog(*number)) {
            Usage(err, "there is no message " + std::to_string(*number) +
                           "; the message numbers are " + CatalogRanges());
            return ParseOutcome{std::nullopt, ExitStatus::Usage};
        }
        if (*number < INT32_MIN || *number > INT32_MAX) {
            Usage(err, "there is no message " + std::to_string(*number));
            return ParseOutcome{std::nullopt, ExitStatus::Usage};
        }
        options.messageNumber = static_cast<int32_t>(*number);
        return ParseOutcome{options, ExitStatus::Clean};
    }

    const int targets = static_cast<int>(scheduleOption->count() > 0) +
                        static_cast<int>(showOption->count() > 0) +
                        static_cast<int>(sequenceOption->count() > 0);
    if (targets == 0) {
        Usage(err, "choose what to verify: --schedule, --show FILE or --sequence FILE");
        return ParseOutcome{std::nullopt, ExitStatus::Usage};
    }
    if (targets > 1) {
        Usage(err, "choose only one of --schedule, --show and --sequence");
        return ParseOutcome{std::nullopt, ExitStatus::Usage};
    }
    if (showOption->count() > 0) {
        if (show.empty()) {
            Usage(err, "Please specify the show file to verify");
            return ParseOutcome{std::nullopt, ExitStatus::Usage};
        }
        options.target = TargetKind::Show;
        options.targetFile = show;
    } else if (sequenceOption->count() > 0) {
        if (sequence.empty()) {
            Usage(err, "Please specify the sequence file to verify");
            return ParseOutcome{std::nullopt, ExitStatus::Usage};
        }
        options.target = TargetKind::Sequence;
        options.targetFile = sequence;
    } else {
        options.target = TargetKind::Schedule;
    }
    for (const auto& [option, value, kept] :
         {std::tuple{outputOption, &output, &options.output},
          std::tuple{baselineOption, &baseline, &options.baseline},
          std::tuple{writeBaselineOption, &writeBaseline, &options.writeBaseline}}) {
        if (option->count() == 0)
            continue;
        if (value->empty()) {
            Usage(err, option->get_name() + " needs a file name");
            return ParseOutcome{std::nullopt, ExitStatus::Usage};
        }
        *kept = *value;
    }

    if (jobsOption->count() > 0) {
        std::size_t used = 0;
        int value = 0;
        try {
            value = std::stoi(jobs, &used);
        } catch (const std::exception&) {
            used = 0;
        }
        if (used == 0 || used != jobs.size() || value < 1 || value > kMaxJobs) {
            Usage(err, "--jobs needs a number of processors from 1 to " + std::to_string(kMaxJobs) +
                           ", not " + Quoted(jobs));
            return ParseOutcome{std::nullopt, ExitStatus::Usage};
        }
        options.jobs = value;
    }

    std::optional<std::string> reason = Choose<Severity>(
        "--severity", severity,
        {{"error", Severity::Error}, {"warning", Severity::Warning}, {"info", Severity::Info}},
        options.minimumSeverity);
    if (!reason) {
        reason = Choose<FailOn>(
            "--fail-on", failOn,
            {{"warning", FailOn::Warning}, {"error", FailOn::Error}, {"never", FailOn::Never}},
            options.failOn);
    }
    if (!reason) {
        reason = Choose<GroupBy>("--group-by", groupBy,
                                 {{"message", GroupBy::Message},
                                  {"show", GroupBy::Show},
                                  {"sequence", GroupBy::Sequence},
                                  {"pair", GroupBy::SequencePair},
                                  {"none", GroupBy::None}},
                                 options.groupBy);
    }
    if (!reason) {
        reason = Choose<ColorChoice>("--color", color,
                                     {{"auto", ColorChoice::Auto},
                                      {"always", ColorChoice::Always},
                                      {"never", ColorChoice::Never}},
                                     options.color);
    }
    if (reason) {
        Usage(err, *reason);
        return ParseOutcome{std::nullopt, ExitStatus::Usage};
    }
    options.statistics = statistics;
    options.log = log;
    options.quiet = quiet;
    return ParseOutcome{options, ExitStatus::Clean};
}

}  // namespace vtr::cli
