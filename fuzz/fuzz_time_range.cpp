// Time ranges and calendar date-times read from text. A range that cannot be read raises one
// of its own errors and keeps what it held; one that is read holds its start before its end
// and writes a text that reads back to the same range. Date texts read back as they were
// written.
//
// The input is two range texts separated by a NUL byte; the second is read into a range that
// already holds the first, and the two are then compared with each other.

#include <cstdint>
#include <optional>
#include <string>

#include "FuzzSupport.h"
#include "engine/VtrError.h"
#include "schedule/DateTime.h"
#include "schedule/TimeRange.h"

namespace {

using vtr::fuzz::Printable;

// Reads text into range; true when it was read. A failure must leave the range unchanged.
bool ReadInto(vtr::TimeRange& range, std::string_view text) {
    const std::string before = range.Serialize();
    try {
        range.Deserialize(text);
    } catch (const vtr::VtrError& e) {
        // Field count (37), list (1 to 4), date (13) or number (6) errors only.
        const int32_t n = e.Number();
        VTR_FUZZ_CHECK(n == 37 || (n >= 1 && n <= 4) || n == 13 || n == 6,
                       Printable(text) + "\nerror " + std::to_string(n) + " " + e.Description());
        VTR_FUZZ_CHECK(range.Serialize() == before, Printable(text));
        return false;
    }
    return true;
}

void CheckRange(const vtr::TimeRange& range, std::string_view text) {
    const std::string context = "text: " + Printable(text);
    if (range.HasStart() && range.HasEnd())
        VTR_FUZZ_CHECK(range.StartTime() <= range.EndTime(), context);
    const std::string written = range.Serialize();
    vtr::TimeRange again;
    VTR_FUZZ_CHECK(ReadInto(again, written), context + "\nwritten: " + written);
    VTR_FUZZ_CHECK(again.Serialize() == written, context + "\nwritten: " + written);
    VTR_FUZZ_CHECK(again.Equals(range) && range.Equals(again), context);
}

void CheckDate(std::string_view text) {
    const std::optional<vtr::DateTime> date = vtr::DateTime::Parse(text);
    if (!date)
        return;
    const std::string written = date->ToString();
    const std::optional<vtr::DateTime> again = vtr::DateTime::Parse(written);
    VTR_FUZZ_CHECK(again && *again == *date, Printable(text) + "\nwritten: " + written);
    VTR_FUZZ_CHECK(vtr::DateTime::Parse(date->DateString()) == date->Date(),
                   Printable(text) + "\ndate: " + date->DateString());
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, std::size_t size) {
    const std::string_view input = vtr::fuzz::AsText(data, size);
    const std::size_t split = input.find('\0');
    const std::string_view first = input.substr(0, split);
    const std::string_view second =
        split == std::string_view::npos ? std::string_view() : input.substr(split + 1);

    CheckDate(first);
    vtr::TimeRange range;
    if (ReadInto(range, first))
        CheckRange(range, first);
    vtr::TimeRange other = range;
    if (ReadInto(other, second))
        CheckRange(other, second);

    // Comparisons between any two ranges and bounds answer without failing.
    for (const bool a : {false, true}) {
        for (const bool b : {false, true}) {
            (void)range.Overlaps(other, a, b, b, a);
            if (other.HasStart()) {
                (void)range.Includes(other.StartTime(), a, b);
                if (other.HasEnd()) {
                    (void)range.IncludesAdjustable(other.StartTime(), other.EndTime(), a, b, a, b,
                                                   a != b);
                }
            }
        }
    }
    (void)range.StartsBeforeOtherEnds(&other);
    return 0;
}
