#pragma once

#include <memory>
#include <string>
#include <vector>

#include "engine/Messages.h"
#include "engine/Result.h"
#include "report/RunReport.h"
#include "schedule/Schedule.h"
#include "schedule/WeekTime.h"
#include "schedule/YearSchedule.h"

// Runs made up by the report tests: results from the catalog with the details a test gives,
// schedules built in memory, and a fixed time of the run (never the machine's clock).
namespace vtr::report::testing {

inline ResultPtr Make(const Message& message, std::vector<std::string> details) {
    auto result = std::make_shared<Result>();
    result->SetMessageNumber(message.number);
    result->SetHelpContextID(message.helpContextId);
    result->SetSeverity(message.severity);
    result->SetSummary(message.summary);
    for (const std::string& detail : details)
        result->AddDetail(detail);
    return result;
}

// A channel conflict between two sequences of a show, as the intersequence check words it.
inline ResultPtr Conflict(const std::string& show, const std::string& sectionA,
                          const std::string& sequenceA, const std::string& sectionB,
                          const std::string& sequenceB, const std::string& channel) {
    return Make(Messages::ChannelConflict,
                {"[SHOW]: " + show, "[SECTION]: " + sectionA, "[SEQUENCE]: " + sequenceA,
                 "[TRACK]: Track 1", "[CHANNEL]: " + channel, "[SECTION]: " + sectionB,
                 "[SEQUENCE]: " + sequenceB, "[TRACK]: Track 2", "[CHANNEL]: " + channel});
}

// Wednesday 2031-03-12, 19:30:00.
inline DateTime RunStart() {
    return DateTime::FromParts(2031, 3, 12, 19, 30, 0);
}

inline RunReport BaseReport() {
    RunReport report;
    report.version = "1.2.3";
    report.started = RunStart();
    report.store = "the settings store /home/ann/registry.reg";
    report.storeChosen = "named with --registry";
    report.storeFile = "/home/ann/registry.reg";
    report.checksPerformed = 141;
    return report;
}

inline std::shared_ptr<Schedule> Week(
    const std::vector<std::pair<std::string, std::pair<WeekTimePtr, WeekTimePtr>>>& shows) {
    auto schedule = std::make_shared<Schedule>();
    for (const auto& [show, times] : shows)
        schedule->AddShowEventByFile(show, times.first, times.second);
    return schedule;
}

}  // namespace vtr::report::testing
