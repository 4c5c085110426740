#include "checks/schedule/CheckShowIsScheduled.h"

#include <memory>

#include "checks/show/CheckShowFileExists.h"
#include "engine/CheckTypes.h"
#include "engine/LibVerify.h"
#include "engine/Messages.h"
#include "engine/VtrError.h"
#include "schedule/DateTime.h"
#include "schedule/Schedule.h"
#include "schedule/YearSchedule.h"

namespace vtr {

void CheckShowIsScheduled::QueueShows(const Schedule& schedule, bool& found) {
    for (Node* node = schedule.FirstNode(); node != nullptr; node = node->NextNode()) {
        const ShowEventPtr& event = node->Obj();
        if (!event || event->EventType() != ShowEvent::ShowFileEvent)
            continue;
        ResumeStep([&] {
            auto check = std::make_shared<CheckShowFileExists>();
            check->SetFilename(event->Filename());
            LibVerify::AddCheck(check);
        });
        found = true;
    }
}

void CheckShowIsScheduled::Check() {
    bool found = false;

    const SchedulePtr weekly = ResumeOr(SchedulePtr{}, [] { return LibVerify::GetSchedule(); });
    if (weekly)
        ResumeStep([&] { QueueShows(*weekly, found); });

    const YearSchedulePtr calendar =
        ResumeOr(YearSchedulePtr{}, [] { return LibVerify::GetYearSchedule(); });
    if (calendar) {
        ResumeStep([&] {
            // Keys are "yyyy-mm-dd", so comparing the texts compares the dates.
            const std::string today = YearSchedule::DateToString(DateTime::Today());
            for (const std::string& key : calendar->Keys()) {
                if (key < today)
                    continue;
                const SchedulePtr day =
                    ResumeOr(SchedulePtr{}, [&] { return calendar->ScheduleByKey(key); });
                if (day)
                    ResumeStep([&] { QueueShows(*day, found); });
            }
        });
    }

    if (!found)
        LibVerify::AddResult(Messages::NoShowsScheduled);
}

std::string CheckShowIsScheduled::CheckIdentifier() {
    return identifier_.Get(CheckType::ShowIsScheduled, "");
}

}  // namespace vtr
