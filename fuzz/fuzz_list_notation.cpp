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
#include <set>
#include <string>
#include <tuple>
#include <vector>

#include "FuzzSupport.h"
#include "engine/VtrError.h"
#include "show/Serialize.h"

namespace {

using vtr::fuzz::Printable;

struct Reading {
    enum class Kind { Items, Error, Endless } kind = Kind::Items;
    std::vector<std::string> items;
    int32_t error = 0;
};

// The first position (from 1) of ch at or after position from; 0 when there is none.
std::size_t Find(const std::string& s, char ch, std::size_t from) {
    if (from < 1 || from > s.size())
        return 0;
    const auto found = s.find(ch, from - 1);
    return found == std::string::npos ? 0 : found + 1;
}

Reading DefinedReading(const std::string& text) {
    Reading reading;
    const std::size_t open = Find(text, '(', 1);
    const auto last = text.rfind(')');
    const std::size_t close = last == std::string::npos ? 0 : last + 1;
    if (open == 0 && close == 0)
        return reading;
    if (open == 0 || close == 0 || open >= close) {
        reading.kind = Reading::Kind::Error;
        reading.error = 1;
        return reading;
    }
    std::string inner = text.substr(open, close - open - 1);
    long depth = 0;
    std::size_t start = 1;
    std::size_t p = Find(inner, '(', 1), c = Find(inner, ')', 1), k = Find(inner, ',', 1);
    std::set<std::tuple<long, std::size_t, std::size_t>> seen;
    auto fail = [&](int32_t number) {
        reading.kind = Reading::Kind::Error;
        reading.error = number;
        reading.items.clear();
    };
    for (;;) {
        if (k < 1 && depth < 1)
            break;
        // Without an item taken, the state is depth, start and the remaining text; meeting
        // one again means the loop goes round for ever.
        if (!seen.insert({depth, start, inner.size()}).second) {
            reading.kind = Reading::Kind::Endless;
            reading.items.clear();
            return reading;
        }
        bool take = false;
        if (depth != 0) {
            if (c == 0) {
                fail(4);
                return reading;
            }
            if (p < 1 || p >= c) {
                start = c + 1;
                --depth;
            } else {
                start = p + 1;
                ++depth;
            }
        } else if (c >= p && (p != 0 || c != 0)) {
            if (k >= p) {
                depth = 1;
                start = p + 1;
            } else {
                take = true;
            }
        } else if (c >= p) {
            take = true;
        } else if (c != 0) {
            fail(3);
            return reading;
        } else {
            fail(2);
            return reading;
        }
        if (take) {
            reading.items.push_back(inner.substr(0, k - 1));
            inner = inner.substr(k);
            start = 1;
            seen.clear();
        }
        p = Find(inner, '(', start);
        c = Find(inner, ')', start);
        k = Find(inner, ',', start);
    }
    reading.items.push_back(inner);
    return reading;
}

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
    const Reading expected = DefinedReading(text);
    std::optional<vtr::Serialize::List> list;
    std::optional<vtr::VtrError> error;
    try {
        list = vtr::Serialize::ListFromText(text, lowerBound);
    } catch (const vtr::VtrError& e) {
        error = e;
    }
    const std::string context = "text: " + Printable(text);
    switch (expected.kind) {
        case Reading::Kind::Items:
            VTR_FUZZ_CHECK(list.has_value(), context + "\nexpected " + Joined(expected.items) +
                                                 "\ngot error " +
                                                 (error ? error->Description() : ""));
            VTR_FUZZ_CHECK(list->Items() == expected.items, context + "\nexpected " +
                                                                Joined(expected.items) + "\ngot " +
                                                                Joined(list->Items()));
            VTR_FUZZ_CHECK(list->LowerBound() == lowerBound, context);
            break;
        case Reading::Kind::Error:
        case Reading::Kind::Endless: {
            const int32_t number = expected.kind == Reading::Kind::Error ? expected.error : 3;
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
