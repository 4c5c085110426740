#include "schedule/MonitoredShowEvent.h"

#include "engine/VtrError.h"
#include "show/Serialize.h"

namespace vtr {

namespace {
namespace lists = vtr::Serialize;
}  // namespace

void MonitoredShowEvent::CopyFrom(const MonitoredShowEvent* other) {
    const MonitoredShowEvent empty;
    Deserialize((other != nullptr ? *other : empty).Serialize());
}

void MonitoredShowEvent::Deserialize(std::string_view text) {
    const auto fields = lists::ListFromText(text, 0);
    if (fields.Count() != 4) {
        Raise(ErrorNumbers::UserMessage, "",
              "Unexpected number of fields in serialized monitored show event: " +
                  std::to_string(fields.Count()));
    }
    std::string filename = lists::UnescapeText(fields[0]);
    TimeRange range;
    range.Deserialize(fields[1]);
    const int32_t scheduleType = lists::TextToLong(fields[2]);
    const bool shuttingDown = lists::TextToBool(fields[3]);
    SetFilename(std::move(filename));
    SetRange(range);
    SetScheduleType(scheduleType);
    SetShuttingDown(shuttingDown);
}

bool MonitoredShowEvent::MemberwiseEquals(const MonitoredShowEvent* other) const {
    const MonitoredShowEvent empty;
    return Serialize() == (other != nullptr ? *other : empty).Serialize();
}

std::string MonitoredShowEvent::Serialize() const {
    return lists::ListToText({lists::EscapeText(filename_), range_.Serialize(),
                              std::to_string(scheduleType_), lists::BoolToText(shuttingDown_)});
}

}  // namespace vtr
