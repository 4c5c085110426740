#pragma once

#include <string>

#include "engine/VtrError.h"

// The runtime errors that the show and schedule models raise besides their own numbered
// ones, each with its fixed description.
namespace vtr::ModelErrors {

[[noreturn]] inline void SubscriptOutOfRange(std::string source) {
    Raise(ErrorNumbers::SubscriptOutOfRange, std::move(source), "Subscript out of range");
}

[[noreturn]] inline void TypeMismatch(std::string source) {
    Raise(ErrorNumbers::TypeMismatch, std::move(source), "Type mismatch");
}

[[noreturn]] inline void Overflow(std::string source) {
    Raise(ErrorNumbers::Overflow, std::move(source), "Overflow");
}

[[noreturn]] inline void ObjectNotSet(std::string source) {
    Raise(ErrorNumbers::ObjectNotSet, std::move(source),
          "Object variable or With block variable not set");
}

[[noreturn]] inline void InvalidProcedureCall(std::string source) {
    Raise(ErrorNumbers::InvalidProcedureCall, std::move(source),
          "Invalid procedure call or argument");
}

}  // namespace vtr::ModelErrors
