// The weekly schedule reader: any text gives a schedule (elements that cannot be read or
// that conflict are left out), never an error or a crash. The schedule's lookup answers as
// a walk over its events does, and what it writes reads back to the same show events.

#include <cstdint>
#include <string>

#include "FuzzSupport.h"
#include "ScheduleChecks.h"
#include "engine/VtrError.h"
#include "schedule/Schedule.h"

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, std::size_t size) {
    const std::string_view text = vtr::fuzz::AsText(data, size);
    vtr::SchedulePtr schedule;
    try {
        schedule = vtr::ScheduleFunctions::ScheduleFromText(text);
    } catch (const vtr::VtrError& e) {
        vtr::fuzz::Fail("the schedule reader never raises",
                        vtr::fuzz::Printable(text) + "\n" + e.Description());
    }
    VTR_FUZZ_CHECK(schedule != nullptr, vtr::fuzz::Printable(text));
    const std::string context = "text: " + vtr::fuzz::Printable(text);
    int32_t extra = 0;
    for (std::size_t i = 0; i < size && i < 3; ++i)
        extra = extra * 256 + data[i];
    vtr::fuzz::CheckLookups(*schedule, context, {extra % vtr::TimeConstants::SecondsPerWeek});
    vtr::fuzz::CheckRewrite(*schedule, context);
    return 0;
}
