#pragma once

#include <cstddef>
#include <cstdint>
#include <string>

#include "sequencelib/Sequence.h"

namespace vtr::fuzz {

// Everything a sequence load keeps, as one text, so that two loads can be compared; or
// "error" when the load failed. The load's progress must rise from 0 to 100, each value
// told at most once, and every channel a track lists must be one of the sequence's own
// channel objects; the run stops when either is broken.
std::string LoadSummary(const std::string& path, const seqlib::LoadOptions& options,
                        const std::string& context);

}  // namespace vtr::fuzz
