#pragma once

#include <cstdint>
#include <stdexcept>
#include <string>
#include <type_traits>
#include <utility>

namespace vtr {

// Error numbers with a fixed meaning across the program.
namespace ErrorNumbers {
inline constexpr int32_t InvalidProcedureCall = 5;
inline constexpr int32_t Overflow = 6;
inline constexpr int32_t SubscriptOutOfRange = 9;
inline constexpr int32_t TypeMismatch = 13;
// A message meant for the user: bad target, malformed data, temporary-file failures.
inline constexpr int32_t UserMessage = 37;
inline constexpr int32_t ObjectNotSet = 91;
inline constexpr int32_t KeyAlreadyExists = 457;
inline constexpr int32_t DictionaryRemoveFailed = 32811;
}  // namespace ErrorNumbers

// The one error type of the program: a number, the operation that raised it (its source)
// and a description, plus the help file and context that a saved error carries along.
class VtrError : public std::runtime_error {
public:
    VtrError(int32_t number, std::string source, std::string description,
             std::string helpFile = {}, int32_t helpContext = 0);

    int32_t Number() const noexcept { return number_; }
    const std::string& Source() const noexcept { return source_; }
    const std::string& Description() const noexcept { return description_; }
    const std::string& HelpFile() const noexcept { return helpFile_; }
    int32_t HelpContext() const noexcept { return helpContext_; }

private:
    int32_t number_;
    std::string source_;
    std::string description_;
    std::string helpFile_;
    int32_t helpContext_;
};

// Raises the error with the given number, source and description.
[[noreturn]] void Raise(int32_t number, std::string source, std::string description);

// Check bodies run "with errors resumed": a step that fails leaves its result at the
// default it started with, and the body carries on with the next step.
//
//   std::string path = ResumeOr(std::string{}, [&] { return SomethingThatMayFail(); });
//   ResumeStep([&] { AddCheck(...); });
//
// Any exception counts as a failure; nothing escapes.
template <typename T, typename F>
T ResumeOr(T fallback, F&& step) noexcept {
    try {
        return static_cast<T>(std::forward<F>(step)());
    } catch (...) {
        return fallback;
    }
}

// Runs a step whose value is not needed; true when it completed.
template <typename F>
bool ResumeStep(F&& step) noexcept {
    try {
        std::forward<F>(step)();
        return true;
    } catch (...) {
        return false;
    }
}

}  // namespace vtr
