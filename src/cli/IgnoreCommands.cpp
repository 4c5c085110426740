#include "IgnoreCommands.h"

#include <nlohmann/json.hpp>

#include <charconv>
#include <ostream>
#include <string_view>

#include "engine/IgnoreKeyText.h"
#include "engine/IgnoreLists.h"
#include "engine/LibVerify.h"
#include "engine/VtrError.h"

namespace vtr::cli {
namespace {

constexpr std::string_view kDetailEnd = " / ";

// Both in-memory lists, freshly read from the store.
void ReloadIgnoreLists() {
    LibVerify::IgnoredMessageNumbers().Clear();
    LibVerify::IgnoredResultKeys().Clear();
    IgnoreLists::LoadIgnoreLists();
}

std::string Quoted(const std::string& text) {
    return "\"" + text + "\"";
}

// A key as the user sees it: in double quotes, in the text form that "ignore --key" takes.
std::string QuotedKey(const std::string& key) {
    return Quoted(IgnoreKeyText::Encode(key));
}

}  // namespace

std::optional<Result> ResultFromIgnoreKey(const std::string& key) {
    const std::size_t dash = key.find('-', key.rfind('-', 0) == 0 ? 1 : 0);
    if (dash == std::string::npos || dash == 0)
        return std::nullopt;
    const std::string number = key.substr(0, dash);
    int32_t messageNumber = 0;
    const auto [end, error] =
        std::from_chars(number.data(), number.data() + number.size(), messageNumber);
    // Only the number's own decimal text can appear in a key ("007" or "+7" never does).
    if (error != std::errc() || end != number.data() + number.size() ||
        std::to_string(messageNumber) != number)
        return std::nullopt;

    const std::string details = key.substr(dash + 1);
    if (!details.empty() && !details.ends_with(kDetailEnd))
        return std::nullopt;
    Result result;
    result.SetMessageNumber(messageNumber);
    // The key joins the details with " / " after each; one detail that holds the whole text
    // gives the same key, whatever " / " the details themselves contain.
    if (!details.empty())
        result.AddDetail(details.substr(0, details.size() - kDetailEnd.size()));
    return result;
}

std::optional<std::string> KeyFromArgument(const std::string& argument) {
    std::optional<std::string> key = IgnoreKeyText::Decode(argument);
    if (!key)
        return std::nullopt;
    // "23-a / b" and "23-a / b /" are "23-a / b / "; "23-" (no details) stays as it is.
    const std::size_t dash = key->find('-', key->starts_with("-") ? 1 : 0);
    const bool hasDetails = dash != std::string::npos && dash + 1 < key->size();
    if (hasDetails && !key->ends_with(kDetailEnd))
        *key += key->ends_with(kDetailEnd.substr(0, 2)) ? " " : std::string(kDetailEnd);
    return key;
}

int RunIgnoreCommand(const Options& options, std::ostream& out, std::ostream& err) {
    const bool ignore = options.command == Command::Ignore;

    std::string what;
    std::string key;  // the result's key, for --key
    if (options.messageNumber) {
        what = "Results with message number " + std::to_string(*options.messageNumber);
    } else {
        const std::string given = options.ignoreKey.value_or("");
        const std::optional<std::string> decoded = KeyFromArgument(given);
        if (!decoded) {
            err << "vantori-verify: " << Quoted(given)
                << " is not a result's key: after \"escaped:\", a backslash begins \"\\\\\" "
                   "(one backslash) or \"\\x\" and two hexadecimal digits (one byte)\n";
            return ExitStatus::Usage;
        }
        key = *decoded;
        if (!ResultFromIgnoreKey(key)) {
            err << "vantori-verify: " << Quoted(given)
                << " is not a result's key: a key is the message number, \"-\", then each "
                   "detail followed by \" / \" (as \"vantori-verify ignored\" and --format "
                   "json show it)\n";
            return ExitStatus::Usage;
        }
        what = "The result " + QuotedKey(key);
    }

    // One change of the list in the store, under its lock; a failure says what went wrong.
    IgnoreLists::ChangeOutcome outcome;
    try {
        if (options.messageNumber) {
            outcome = ignore ? IgnoreLists::AddIgnoredMessageNumber(*options.messageNumber)
                             : IgnoreLists::RemoveIgnoredMessageNumber(*options.messageNumber);
        } else {
            outcome = ignore ? IgnoreLists::AddIgnoredResultKey(key)
                             : IgnoreLists::RemoveIgnoredResultKey(key);
        }
    } catch (const VtrError& error) {
        err << "vantori-verify: " << error.Description() << "\n";
        return ExitStatus::CannotSetUp;
    }
    const bool listed = outcome == IgnoreLists::ChangeOutcome::AlreadyListed ||
                        outcome == IgnoreLists::ChangeOutcome::Removed;

    const bool plural = options.messageNumber.has_value();
    if (ignore) {
        out << what
            << (listed ? (plural ? " are already ignored." : " is already ignored.")
                       : " will be ignored.")
            << "\n";
    } else {
        out << what
            << (listed ? (plural ? " are no longer ignored." : " is no longer ignored.")
                       : (plural ? " were not ignored." : " was not ignored."))
            << "\n";
    }
    return ExitStatus::Clean;
}

int RunListIgnored(const Options& options, std::ostream& out) {
    ReloadIgnoreLists();
    const auto& numbers = LibVerify::IgnoredMessageNumbers().Entries();
    const auto& keys = LibVerify::IgnoredResultKeys().Entries();

    if (options.format == OutputFormat::Json) {
        nlohmann::ordered_json document;
        document["messageNumbers"] = numbers;
        nlohmann::ordered_json texts = nlohmann::ordered_json::array();
        for (const std::string& key : keys)
            texts.push_back(IgnoreKeyText::Encode(key));
        document["results"] = std::move(texts);
        out << document.dump(2, ' ', false, nlohmann::ordered_json::error_handler_t::replace)
            << "\n";
        return ExitStatus::Clean;
    }

    out << "Ignored message numbers:\n";
    if (numbers.empty())
        out << "    (none)\n";
    for (const std::string& number : numbers)
        out << "    " << number << "\n";
    out << "Ignored results:\n";
    if (keys.empty())
        out << "    (none)\n";
    for (const std::string& key : keys)
        out << "    " << QuotedKey(key) << "\n";
    return ExitStatus::Clean;
}

}  // namespace vtr::cli
