// The list notation reader against the reading algorithm as the suite defines it, step by
// step (positions from 1, every search restarting from the current start, every item cut
// from the beginning of the remaining text). The reader under test is a linear-time
// reformulation; both must give the same items or the same numbered error. Where the
// defined algorithm never ends (a second stray ")" at depth 0 sends it back to the same
// place), the reader refuses the text with error 3.
//
// The first byte of the input picks the lower bound; the rest is the text.

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

#include "FuzzSupport.h"
#include "engine/VtrError.h"
#include "show/Serialize.h"
#include "support/LiteralListReader.h"

namespace {

using vtr::fuzz::Printable;
using vtr::testsupport::LiteralReading;

const char* DescriptionOf(int32_t number) {
    switch (number) {
        case 1:
            return "Badly formatted list, enclosing parens";
        case 3:
            return "Badly formatted list, unexpected closing paren";
        default:
            return "Badly formatted list, missing closing paren";
    }
}

std::string Joined(const std::vector<std::string>& items) {
    std::string out = std::to_string(items.size()) + " items:";
    for (const auto& item : items)
        out += " [" + Printable(item, 80) + "]";
    return out;
}

void Compare(const std::string& text, int32_t lowerBound) {
    const LiteralReading expected = vtr::testsupport::ReadListLiterally(text);
    std::optional<vtr::Serialize::List> list;
    std::optional<vtr::VtrError> error;
    try {
        list = vtr::Serialize::ListFromText(text, lowerBound);
    } catch (const vtr::VtrError& e) {
        error = e;
    }
    const std::string context = "text: " + Printable(text);
    switch (expected.kind) {
        case LiteralReading::Kind::Items:
            VTR_FUZZ_CHECK(list.has_value(), context + "\nexpected " + Joined(expected.items) +
                                                 "\ngot error " +
                                                 (error ? error->Description() : ""));
            VTR_FUZZ_CHECK(list->Items() == expected.items, context + "\nexpected " +
                                                                Joined(expected.items) + "\ngot " +
                                                                Joined(list->Items()));
            VTR_FUZZ_CHECK(list->LowerBound() == lowerBound, context);
            break;
        case LiteralReading::Kind::Error:
        case LiteralReading::Kind::Endless: {
            const int32_t number =
                expected.kind == LiteralReading::Kind::Error ? expected.error : 3;
            VTR_FUZZ_CHECK(error.has_value(), context + "\nexpected error " +
                                                  std::to_string(number) + ", got " +
                                                  Joined(list->Items()));
            VTR_FUZZ_CHECK(error->Number() == number &&
                               error->Source() == "Serialize.ListFromText" &&
                               error->Description() == DescriptionOf(number),
                           context + "\nexpected error " + std::to_string(number) + ", got " +
                               std::to_string(error->Number()) + " " + error->Source() + ": " +
                               error->Description());
            break;
        }
    }
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, std::size_t size) {
    std::string_view input = vtr::fuzz::AsText(data, size);
    static constexpr int32_t kBounds[] = {1, 0, -3, 2147483647};
    const int32_t lowerBound = kBounds[vtr::fuzz::TakeByte(input) % 4];
    const std::string text(input);

    Compare(text, lowerBound);
    // The items of a record are read again as lists by the record readers.
    try {
        int nested = 0;
        for (const std::string& item : vtr::Serialize::ListFromText(text, 1)) {
            if (item.find('(') != std::string::npos && ++nested <= 8)
                Compare(item, 1);
        }
    } catch (const vtr::VtrError&) {
    }

    // Escaping is undone exactly, whatever the text holds.
    VTR_FUZZ_CHECK(vtr::Serialize::UnescapeText(vtr::Serialize::EscapeText(text)) == text,
                   "text: " + Printable(text));
    // The converters fail only with their own errors.
    try {
        (void)vtr::Serialize::TextToLong(text);
    } catch (const vtr::VtrError& e) {
        VTR_FUZZ_CHECK(e.Number() == 13 || e.Number() == 6, "text: " + Printable(text));
    }
    (void)vtr::Serialize::TextToBool(text);
    (void)vtr::Serialize::LeadingNumber(text);
    return 0;
}
