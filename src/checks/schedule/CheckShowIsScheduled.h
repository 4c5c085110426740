#pragma once

#include <string>

#include "engine/CheckUtils.h"
#include "engine/ICheck.h"

namespace vtr {

class Schedule;

// At least one show is scheduled: walks the weekly schedule and the calendar schedule's
// dates from today on, and queues a show check for every show event found.
class CheckShowIsScheduled : public ICheck {
  public:
    void Check() override;
    std::string CheckIdentifier() override;
    std::string Description() override { return "At least one show scheduled"; }

  private:
    // Queues a CheckShowFileExists per show event (the queue drops repeats) and sets found
    // for each.
    static void QueueShows(const Schedule& schedule, bool& found);

    CheckUtils::IdentifierOnce identifier_;
};

}  // namespace vtr
