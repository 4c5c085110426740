#pragma once

#include <cstdint>
#include <exception>
#include <stdexcept>
#include <string>
#include <string_view>
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
    VtrError(int32_t number, std::string source, std::string description, std::string helpFile = {},
             int32_t helpContext = 0);

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

// The text a user is shown for a caught exception: a VtrError's description, any other
// standard exception's what(), and `unknown` for anything else (or for no exception).
std::string DescribeException(const std::exception_ptr& failure,
                              std::string_view unknown = "Unknown error");

// What the resume helpers below swallow is told, as DescribeException's text, to one
// reporter for the whole process. None is set by default: the program stays silent. The
// environment variable VANTORI_TRACE_RESUMED (any value but "" or "0"), read the first time
// a step fails, sets one that writes each failure to standard error; the tests set their
// own. The reporter may be called from any thread and must not throw.
using ResumeReporter = void (*)(std::string_view description);
void SetResumeReporter(ResumeReporter reporter) noexcept;
ResumeReporter GetResumeReporter() noexcept;
// Tells the reporter, if any, of the exception being handled. Called from a catch block.
void ReportResumedFailure() noexcept;

// Check bodies run "with errors resumed": a step that fails leaves its result at the
// default it started with, and the body carries on with the next step.
//
//   std::string path = ResumeOr(std::string{}, [&] { return SomethingThatMayFail(); });
//   ResumeStep([&] { SetSomething(...); });
//
// Any exception counts as a failure; nothing escapes. LibVerify::AddResult and AddCheck
// never throw, so a call of theirs needs no helper of its own.
template <typename T, typename F>
T ResumeOr(T fallback, F&& step) noexcept {
    try {
        return static_cast<T>(std::forward<F>(step)());
    } catch (...) {
        ReportResumedFailure();
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
        ReportResumedFailure();
        return false;
    }
}

}  // namespace vtr
