#include "engine/VtrError.h"

namespace vtr {

VtrError::VtrError(int32_t number, std::string source, std::string description,
                   std::string helpFile, int32_t helpContext)
    : std::runtime_error(description),
      number_(number),
      source_(std::move(source)),
      description_(std::move(description)),
      helpFile_(std::move(helpFile)),
      helpContext_(helpContext) {}

void Raise(int32_t number, std::string source, std::string description) {
    throw VtrError(number, std::move(source), std::move(description));
}

}  // namespace vtr
