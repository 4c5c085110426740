#pragma once

#include <cstdint>

// What a result of each message means and what to do about it, in a sentence or three: the
// help text of the reports that travel without the suite's help file (the HTML and SARIF
// reports). The catalog's summary says what was found; this says what to do next.
namespace vtr::MessageAdvice {

// The advice for a message number of the catalog; nullptr for any other number.
const char* For(int32_t messageNumber);

}  // namespace vtr::MessageAdvice
