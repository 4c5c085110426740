// The calendar schedule reader: any text gives a calendar (dates that cannot be read or that
// repeat are left out), never an error or a crash. Every date's schedule keeps the weekly
// schedule's properties, and the calendar writes a text that reads back to the same dates and
// shows.

#include <cstdint>
#include <string>

#include "FuzzSupport.h"
#include "ScheduleChecks.h"
#include "engine/VtrError.h"
#include "schedule/YearSchedule.h"

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, std::size_t size) {
    const std::string_view text = vtr::fuzz::AsText(data, size);
    const std::string context = "text: " + vtr::fuzz::Printable(text);
    vtr::YearSchedulePtr calendar;
    try {
        calendar = vtr::YearScheduleFunctions::YearScheduleFromText(text);
    } catch (const vtr::VtrError& e) {
        vtr::fuzz::Fail("the calendar reader never raises", context + "\n" + e.Description());
    }
    VTR_FUZZ_CHECK(calendar != nullptr, context);
    int dates = 0;
    for (const std::string& key : calendar->Keys()) {
        const vtr::SchedulePtr day = calendar->ScheduleByKey(key);
        VTR_FUZZ_CHECK(day != nullptr, context + "\ndate " + key);
        if (++dates <= 8) {
            vtr::fuzz::CheckLookups(*day, context + "\ndate " + key);
        }
        // Every key is a date that reads back as itself.
        VTR_FUZZ_CHECK(
            vtr::YearSchedule::DateToString(vtr::YearSchedule::DateStringToDate(key)) == key,
            context + "\ndate " + key);
    }
    // Written and read again: the same dates in the same order, each with the same shows
    // (where the date's schedule tiles the week).
    const std::string written = vtr::YearScheduleFunctions::YearScheduleToText(*calendar);
    const vtr::YearSchedulePtr again = vtr::YearScheduleFunctions::YearScheduleFromText(written);
    VTR_FUZZ_CHECK(again->Keys() == calendar->Keys(),
                   context + "\nwritten: " + vtr::fuzz::Printable(written));
    for (const std::string& key : calendar->Keys()) {
        if (!vtr::fuzz::TilesTheWeek(*calendar->ScheduleByKey(key)))
            continue;
        VTR_FUZZ_CHECK(vtr::fuzz::Content(*again->ScheduleByKey(key)) ==
                           vtr::fuzz::Content(*calendar->ScheduleByKey(key)),
                       context + "\nwritten: " + vtr::fuzz::Printable(written) + "\ndate " + key);
    }
    return 0;
}
