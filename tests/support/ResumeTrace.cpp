// During the tests every failure that a resumed step swallows is written to standard error,
// so that the output of a failing test shows what went wrong on its way. A test that checks
// the reporter sets its own and puts this one back.
#include <cstdio>
#include <string_view>

#include "engine/VtrError.h"

namespace {

void WriteResumedFailure(std::string_view description) {
    std::fprintf(stderr, "[resumed] %.*s\n", static_cast<int>(description.size()),
                 description.data());
}

[[maybe_unused]] const bool kTraced = (vtr::SetResumeReporter(&WriteResumedFailure), true);

}  // namespace
