#pragma once

#include <string>

#include "engine/ICheck.h"
#include "engine/Result.h"

namespace vtr {

// Follows a verification as it runs (the window, the command line).
class INotificationClient {
public:
    virtual ~INotificationClient() = default;
    virtual void CheckAdded(ICheck& check) = 0;
    virtual void CheckCompleted(ICheck& check) = 0;
    virtual void Checking(ICheck& check) = 0;
    virtual void ChecksCompleted(bool cancelled) = 0;
    virtual void Initializing() = 0;
    virtual void ResultAdded(const ResultPtr& result) = 0;
    virtual void TransientMessage(const std::string& message) = 0;
    virtual void VerificationCancelled() = 0;
};

}  // namespace vtr
