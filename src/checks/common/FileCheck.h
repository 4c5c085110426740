#pragma once

#include <cstdint>
#include <string>
#include <utility>

#include "engine/CheckUtils.h"
#include "engine/ICheck.h"

namespace vtr {

// The shape shared by the checks about one file (a show or a sequence): the file is the
// parameter of the check's identifier and ends the line the check shows in the log.
// Setting the file clears the kept identifier, which is made again on the next request.
class FileCheck : public ICheck {
  public:
    const std::string& Filename() const { return filename_; }
    void SetFilename(std::string filename) {
        filename_ = std::move(filename);
        identifier_ = {};
    }

    std::string CheckIdentifier() override { return identifier_.Get(checkType_, filename_); }
    std::string Description() override { return descriptionPrefix_ + filename_; }

  protected:
    FileCheck(int32_t checkType, const char* descriptionPrefix, std::string filename)
        : filename_(std::move(filename)),
          checkType_(checkType),
          descriptionPrefix_(descriptionPrefix) {}

    std::string filename_;

  private:
    int32_t checkType_;
    const char* descriptionPrefix_;
    CheckUtils::IdentifierOnce identifier_;
};

}  // namespace vtr
