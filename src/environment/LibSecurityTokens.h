#pragma once

#include <string>

namespace vtr::LibSecurityTokens {

bool SetTokenPrivilege(const std::string& privilegeName, bool enable);
bool EnableTokenPrivilege(const std::string& privilegeName);
bool DisableTokenPrivilege(const std::string& privilegeName);

}  // namespace vtr::LibSecurityTokens
