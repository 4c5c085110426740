// The monitored show event record: (file name,(time range),schedule type,shutting down).
// Reading a text either fails with one of the record's errors and leaves the event as it
// was, or gives an event that writes a text reading back to the same event.

#include <cstdint>
#include <string>

#include "FuzzSupport.h"
#include "engine/VtrError.h"
#include "schedule/MonitoredShowEvent.h"

namespace {

using vtr::fuzz::Printable;

bool ReadInto(vtr::MonitoredShowEvent& event, std::string_view text) {
    const std::string before = event.Serialize();
    try {
        event.Deserialize(text);
    } catch (const vtr::VtrError& e) {
        const int32_t n = e.Number();
        VTR_FUZZ_CHECK(n == 37 || (n >= 1 && n <= 4) || n == 13 || n == 6,
                       Printable(text) + "\nerror " + std::to_string(n) + " " + e.Description());
        VTR_FUZZ_CHECK(event.Serialize() == before, Printable(text));
        return false;
    }
    return true;
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, std::size_t size) {
    const std::string_view text = vtr::fuzz::AsText(data, size);
    // An event that already holds something, so that a failed read has something to keep.
    vtr::MonitoredShowEvent event;
    event.SetFilename("C:\\Shows\\Held (1).lss");
    event.SetScheduleType(2);
    event.SetShuttingDown(true);
    if (!ReadInto(event, text))
        return 0;
    const std::string written = event.Serialize();
    vtr::MonitoredShowEvent again;
    VTR_FUZZ_CHECK(ReadInto(again, written),
                   "text: " + Printable(text) + "\nwritten: " + Printable(written));
    VTR_FUZZ_CHECK(again.Serialize() == written,
                   "text: " + Printable(text) + "\nwritten: " + Printable(written));
    VTR_FUZZ_CHECK(again.MemberwiseEquals(&event) && again.Filename() == event.Filename(),
                   "text: " + Printable(text));
    vtr::MonitoredShowEvent copy;
    copy.CopyFrom(&event);
    VTR_FUZZ_CHECK(copy.MemberwiseEquals(&event), "text: " + Printable(text));
    return 0;
}
