// The shell-command map ("shellcmd.map"): one list whose items are (identifier, command line)
// pairs of escaped texts. Any file content gives a command text or "", never an error; the
// command of an identifier is that of the first pair naming it.
//
// The input's first line is the identifier asked for; the rest is the map file.

#include <cstdint>
#include <optional>
#include <string>
#include <utility>
#include <vector>

#include "FuzzSupport.h"
#include "engine/VtrError.h"
#include "sequencelib/ShellCommandMap.h"
#include "show/Serialize.h"

namespace {

// The pairs of the map in order, as the map defines them; nothing when the text is not a
// list.
std::optional<std::vector<std::pair<std::string, std::string>>> Pairs(std::string_view text) {
    std::vector<std::pair<std::string, std::string>> pairs;
    try {
        for (const std::string& item : vtr::Serialize::ListFromText(text, 0)) {
            if (item.empty() || item.front() != '(')
                continue;
            const vtr::Serialize::List pair = vtr::Serialize::ListFromText(item, 0);
            if (pair.Count() >= 2) {
                pairs.emplace_back(vtr::Serialize::UnescapeText(pair[0]),
                                   vtr::Serialize::UnescapeText(pair[1]));
            }
        }
    } catch (const vtr::VtrError&) {
        return std::nullopt;
    }
    return pairs;
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, std::size_t size) {
    const std::string_view input = vtr::fuzz::AsText(data, size);
    const std::size_t newline = input.find('\n');
    const std::string identifier(input.substr(0, newline));
    const std::string_view map =
        newline == std::string_view::npos ? std::string_view() : input.substr(newline + 1);
    const std::string path = vtr::fuzz::ScratchFolder::Instance().Write("shellcmd.map", map);
    const std::string context =
        "identifier: " + vtr::fuzz::Printable(identifier) + "\nmap: " + vtr::fuzz::Printable(map);

    std::string command;
    try {
        command = vtr::seqlib::ShellCommandMap::CommandTextIn(path, identifier);
    } catch (const std::exception& e) {
        vtr::fuzz::Fail("the map never raises", context + "\n" + e.what());
    }
    // When every item of the map reads, the answer is the first pair with the identifier.
    const auto pairs = Pairs(map);
    if (pairs) {
        std::string expected;
        for (const auto& [id, line] : *pairs) {
            if (id == identifier) {
                expected = line;
                break;
            }
        }
        VTR_FUZZ_CHECK(command == expected, context + "\ngot: " + vtr::fuzz::Printable(command) +
                                                "\nexpected: " + vtr::fuzz::Printable(expected));
    }
    return 0;
}
