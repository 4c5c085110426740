#include <set>

#include "VtrVersion.h"
#include "checks/show/CheckLoadShowFile.h"
#include "engine/LibVerify.h"
#include "engine/VtrError.h"
#include "environment/RegistryStore.h"
#include "environment/VTRCommon.h"
#include "report/RunReport.h"
#include "report/WeekPicture.h"
#include "schedule/Schedule.h"
#include "schedule/YearSchedule.h"
#include "sequencelib/Channel.h"
#include "sequencelib/Sequence.h"
#include "show/Show.h"

namespace vtr::report {
namespace {

// The files a show plays, from what the run loaded: its sequences and, as deep as the run
// went, the subsequences they play. Nothing is read from disk.
std::vector<std::string> FilesPlayedBy(const Show& show) {
    std::vector<std::string> files;
    std::set<std::string> seen;
    std::vector<std::string> pending;
    for (const ShowReference& reference : CheckLoadShowFile::WalkShow(show)) {
        if (reference.kind == ShowReference::Kind::Sequence && !reference.sequenceFile.empty())
            pending.push_back(reference.sequenceFile);
    }
    while (!pending.empty()) {
        const std::string file = std::move(pending.back());
        pending.pop_back();
        if (!seen.insert(file).second)
            continue;
        files.push_back(file);
        const auto sequence = LibVerify::LoadedSequence(file);
        if (!sequence)
            continue;
        for (const auto& channel : sequence->Channels()) {
            if (channel && channel->IsSubsequence() && !channel->SubsequenceFile().empty())
                pending.push_back(channel->SubsequenceFile());
        }
    }
    return files;
}

}  // namespace

const char* TargetName(Target target) {
    switch (target) {
        case Target::Schedule:
            return "schedule";
        case Target::Show:
            return "show";
        case Target::Sequence:
            return "sequence";
    }
    return "";
}

void AddRunContext(RunReport& report) {
    report.version = kVersionText;
    const LibVerify::RunInfo run = LibVerify::GetRunInfo();
    report.started = run.started;
    report.startedUtc = run.startedUtc;
    report.finishedUtc = run.finishedUtc;

    report.storeFile =
        ResumeOr(std::optional<std::string>{}, [] { return RegistryStore::CurrentFile(); });
    report.store = report.storeFile ? "the settings store " + *report.storeFile
                                    : "the Windows registry (HKEY_CURRENT_USER)";

    switch (report.target) {
        case Target::Schedule:
            report.weekly = ResumeOr(SchedulePtr{}, [] { return LibVerify::GetSchedule(); });
            report.calendar =
                ResumeOr(YearSchedulePtr{}, [] { return LibVerify::GetYearSchedule(); });
            break;
        case Target::Show:
            // The run verified the show inside a schedule of its own making; the week worth
            // drawing is the suite's.
            report.weekly = ResumeOr(SchedulePtr{}, [] {
                return ScheduleFunctions::LoadSchedule(VTRCommon::GetWeeklyScheduleFile());
            });
            report.calendar = ResumeOr(YearSchedulePtr{}, [] {
                return YearScheduleFunctions::LoadYearSchedule(VTRCommon::GetYearlyScheduleFile());
            });
            break;
        case Target::Sequence:
            break;
    }

    std::vector<std::string> shows =
        ShowsOf(DrawWeek(report.weekly.get(), report.calendar.get(), report.started.Date()));
    if (report.target == Target::Show)
        shows.push_back(report.targetFile);
    for (const std::string& file : shows) {
        if (const auto show = LibVerify::LoadedShow(file))
            report.showFiles[file] = FilesPlayedBy(*show);
    }
}

RunReport LastRunReport() {
    const LibVerify::RunInfo run = LibVerify::GetRunInfo();
    RunReport report;
    switch (run.target) {
        case LibVerify::TargetKind::Schedule:
            report.target = Target::Schedule;
            break;
        case LibVerify::TargetKind::Show:
            report.target = Target::Show;
            break;
        case LibVerify::TargetKind::Sequence:
            report.target = Target::Sequence;
            break;
    }
    report.targetFile = run.targetFile;
    report.cancelled = LibVerify::IsCancelled();
    report.checksPerformed = LibVerify::ChecksPerformedCount();
    report.results = LastRunResults();
    AddRunContext(report);
    return report;
}

std::vector<ReportedResult> LastRunResults() {
    std::vector<ReportedResult> results;
    for (const auto* list : {&LibVerify::GetResults(), &LibVerify::GetIgnoredResults()}) {
        for (const ResultPtr& result : *list) {
            if (result)
                results.push_back(ReportedResult{
                    result, ResumeOr(false, [&] { return result->Ignorable(); }), false});
        }
    }
    return results;
}

}  // namespace vtr::report
