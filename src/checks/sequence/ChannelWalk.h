#pragma once

#include <functional>
#include <string>

#include "engine/Messages.h"

namespace vtr {
namespace seqlib {
class Channel;
}

namespace ChannelWalk {

// Walks every channel of every track of the sequence (a channel that several tracks list,
// once per track) and reports `message` for each one that fails `passes`, with the details
// "[SEQUENCE]: ", "[TRACK]: " and "[CHANNEL]: ". A channel named "c0" first in the first
// track is the placeholder channel of an empty sequence and is never reported. A sequence
// that cannot be loaded gives nothing (its load check reports it).
void ReportChannelsFailing(const std::string& sequenceFile, const Message& message,
                           const std::function<bool(const seqlib::Channel&)>& passes);

}  // namespace ChannelWalk
}  // namespace vtr
