#include "environment/LibSecurityTokens.h"

#ifdef _WIN32
#include <windows.h>
#endif

namespace vtr::LibSecurityTokens {

#ifdef _WIN32

bool SetTokenPrivilege(const std::string& privilegeName, bool enable) {
    HANDLE token = nullptr;
    if (!OpenProcessToken(GetCurrentProcess(), TOKEN_ADJUST_PRIVILEGES, &token))
        return false;
    LUID id;
    if (!LookupPrivilegeValueA(nullptr, privilegeName.c_str(), &id))
        return false;
    TOKEN_PRIVILEGES privileges;
    privileges.PrivilegeCount = 1;
    privileges.Privileges[0].Luid = id;
    privileges.Privileges[0].Attributes = enable ? SE_PRIVILEGE_ENABLED : 0;
    SetLastError(ERROR_SUCCESS);
    // A partial assignment succeeds as a call but leaves ERROR_NOT_ALL_ASSIGNED behind: that
    // counts as failure too.
    if (!AdjustTokenPrivileges(token, FALSE, &privileges, 0, nullptr, nullptr) ||
        GetLastError() != ERROR_SUCCESS) {
        // On failure the token handle is deliberately left open, as this operation has
        // always done.
        return false;
    }
    CloseHandle(token);
    return true;
}

#else

// Token privileges exist only on Windows; elsewhere there is nothing to adjust.
bool SetTokenPrivilege(const std::string& /*privilegeName*/, bool /*enable*/) {
    return true;
}

#endif

bool EnableTokenPrivilege(const std::string& privilegeName) {
    return SetTokenPrivilege(privilegeName, true);
}

bool DisableTokenPrivilege(const std::string& privilegeName) {
    return SetTokenPrivilege(privilegeName, false);
}

}  // namespace vtr::LibSecurityTokens
