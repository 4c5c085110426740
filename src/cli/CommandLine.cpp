#include "CommandLine.h"

#include <CLI/CLI.hpp>

#include <ostream>
#include <string>
#include <vector>

#include "VtrVersion.h"

namespace vtr::cli {
namespace {

constexpr const char* kProgram = "vantori-verify";

const char* const kFooter =
    "Exit status: 0 when no warning or error was found (ignored results do not count),\n"
    "1 when warnings but no errors were found, 2 when errors were found, 3 when the\n"
    "target or the settings store cannot be set up, 64 for wrong usage.\n"
    "\n"
    "The settings store is the file named by --registry, else by VANTORI_REGISTRY, else\n"
    "the per-user default. The verification never changes a file of the suite.";

void Usage(std::ostream& err, const std::string& reason) {
    err << kProgram << ": " << reason << "\n"
        << "Run with --help for more information.\n";
}

// The options that the two ignore subcommands share.
struct IgnoreArguments {
    int32_t messageNumber = 0;
    std::string key;
    CLI::Option* message = nullptr;
    CLI::Option* keyOption = nullptr;
};

CLI::App* AddIgnoreCommand(CLI::App& app, const std::string& name, const std::string& help,
                           IgnoreArguments& arguments) {
    CLI::App* command = app.add_subcommand(name, help);
    // Options of the whole program (--registry, --format) may follow the command's name.
    command->fallthrough();
    arguments.message = command
                            ->add_option("--message", arguments.messageNumber,
                                         "every result with this message number")
                            ->check(CLI::NonNegativeNumber)
                            ->type_name("N");
    arguments.keyOption =
        command
            ->add_option("--key", arguments.key,
                         "one result, by its key: the message number, \"-\", then each detail "
                         "followed by \" / \" (as \"ignored\" and --format json show it)")
            ->type_name("KEY");
    arguments.message->excludes(arguments.keyOption);
    return command;
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

ParseOutcome ParseCommandLine(int argc, const char* const* argv, std::ostream& out,
                              std::ostream& err) {
    CLI::App app{
        "Checks a Vantori show-lighting installation before the show runs: settings, "
        "schedules, shows, sequences, channel conflicts and network usage.",
        kProgram};
    app.footer(kFooter);
    app.set_version_flag("--version", std::string(kProgram) + " " + kVersionText);
    app.failure_message([](const CLI::App*, const CLI::Error& error) {
        return std::string(kProgram) + ": " + error.what() +
               "\nRun with --help for more information.\n";
    });

    bool schedule = false;
    std::string show;
    std::string sequence;
    std::string registry;
    std::string format = "text";
    std::string output;
    bool log = false;
    bool quiet = false;

    CLI::Option* scheduleOption =
        app.add_flag("--schedule", schedule, "verify the entire schedule (weekly and calendar)");
    CLI::Option* showOption =
        app.add_option("--show", show, "verify one show file")->type_name("FILE");
    CLI::Option* sequenceOption =
        app.add_option("--sequence", sequence, "verify one sequence file")->type_name("FILE");
    CLI::Option* registryOption =
        app.add_option("--registry", registry, "the settings store file to use")->type_name("FILE");
    app.add_option("--format", format, "how results are printed (default: text)")
        ->check(CLI::IsMember({"text", "json"}))
        ->type_name("text|json");
    CLI::Option* outputOption =
        app.add_option("--output", output, "also save the results report to this file")
            ->type_name("FILE");
    CLI::Option* logOption =
        app.add_flag("--log", log, "write the output log to standard error as the run goes");
    CLI::Option* quietOption = app.add_flag("--quiet", quiet, "no progress display on a terminal");

    IgnoreArguments ignoreArguments;
    IgnoreArguments unignoreArguments;
    CLI::App* ignore =
        AddIgnoreCommand(app, "ignore", "ignore results in later verifications", ignoreArguments);
    CLI::App* unignore =
        AddIgnoreCommand(app, "unignore", "stop ignoring results", unignoreArguments);
    CLI::App* ignored = app.add_subcommand("ignored", "list both ignore lists");
    ignored->fallthrough();
    app.require_subcommand(0, 1);

    try {
        app.parse(argc, argv);
    } catch (const CLI::ParseError& error) {
        const int status = app.exit(error, out, err);
        return ParseOutcome{std::nullopt, status == 0 ? ExitStatus::Clean : ExitStatus::Usage};
    }

    Options options;
    if (registryOption->count() > 0)
        options.registry = registry;
    options.format = format == "json" ? OutputFormat::Json : OutputFormat::Text;

    const bool anyTarget =
        scheduleOption->count() + showOption->count() + sequenceOption->count() > 0;
    const bool anyRunOption = outputOption->count() + logOption->count() + quietOption->count() > 0;

    CLI::App* chosen = nullptr;
    for (CLI::App* command : {ignore, unignore, ignored}) {
        if (command->parsed())
            chosen = command;
    }
    if (chosen != nullptr) {
        if (anyTarget || anyRunOption) {
            Usage(err, "\"" + chosen->get_name() +
                           "\" cannot be combined with a verification's options "
                           "(--schedule, --show, --sequence, --output, --log, --quiet)");
            return ParseOutcome{std::nullopt, ExitStatus::Usage};
        }
        if (chosen == ignored) {
            options.command = Command::ListIgnored;
            return ParseOutcome{options, ExitStatus::Clean};
        }
        const IgnoreArguments& arguments = chosen == ignore ? ignoreArguments : unignoreArguments;
        options.command = chosen == ignore ? Command::Ignore : Command::Unignore;
        if (arguments.message->count() > 0) {
            options.messageNumber = arguments.messageNumber;
        } else if (arguments.keyOption->count() > 0) {
            options.ignoreKey = arguments.key;
        } else {
            Usage(err, "\"" + chosen->get_name() + "\" needs --message N or --key KEY");
            return ParseOutcome{std::nullopt, ExitStatus::Usage};
        }
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
    if (outputOption->count() > 0) {
        if (output.empty()) {
            Usage(err, "--output needs a file name");
            return ParseOutcome{std::nullopt, ExitStatus::Usage};
        }
        options.output = output;
    }
    options.log = log;
    options.quiet = quiet;
    return ParseOutcome{options, ExitStatus::Clean};
}

}  // namespace vtr::cli
