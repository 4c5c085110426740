#pragma once

#include <cstdint>
#include <functional>
#include <string>

#include "engine/ICheck.h"
#include "engine/INotificationClient.h"
#include "engine/Result.h"
#include "schedule/DateTime.h"

// The output log that follows a verification: one line per logged step, each the time stamp
// "h:mm:ss AMPM", ": " and the step's text. The window and the command line both write their
// log through this module, so the two write identical lines.
//
//   OutputLog::LogWriter writer(
//       [&](const OutputLog::LogLine& line) { Append(line.Formatted(), line.colour); },
//       [&] { ClearLog(); });
//   LibVerify::AddNotificationClient(&writer);
namespace vtr::OutputLog {

// A text colour of the log.
struct Colour {
    uint8_t red = 0;
    uint8_t green = 0;
    uint8_t blue = 0;
    bool operator==(const Colour&) const = default;
};

inline constexpr Colour kBlack{0, 0, 0};
inline constexpr Colour kBlue{0, 0, 255};
inline constexpr Colour kOrange{255, 128, 0};
inline constexpr Colour kRed{255, 0, 0};

// The colour of a result's line: Info blue, Warning orange, Error red, any other severity
// black. Lines that are not results are black.
Colour ResultColour(Severity severity);

// The time of day on a 12-hour clock: "3:07:09 PM", "12:00:00 AM" (hour unpadded, minutes
// and seconds with two digits).
std::string TimeStamp(const DateTime& when);
// The same for DateTime::Now().
std::string TimeStamp();

// The texts of the logged notifications.
std::string CheckAddedText(ICheck& check);  // "Adding check: " + Description()
std::string CheckingText(ICheck& check);    // "Checking: " + Description()
// "Stopping verification due to cancellation" when cancelled, else "Verification completed".
std::string ChecksCompletedText(bool cancelled);
// The summary, then, when there are details, ": " and the details joined with " / ".
std::string ResultText(const Result& result);

// One line of the log.
struct LogLine {
    std::string timeStamp;  // "h:mm:ss AMPM"
    std::string text;
    Colour colour = kBlack;

    // timeStamp + ": " + text, without a line break.
    std::string Formatted() const;
};

// timeStamp + ": " + text for the given moment, and for DateTime::Now().
std::string FormatLine(const DateTime& when, const std::string& text);
std::string FormatLine(const std::string& text);

// The log writer as a notification client: each notification that the log records becomes
// one call of the sink, stamped with DateTime::Now() when it arrives —
//   CheckAdded: "Adding check: " + Description();  Checking: "Checking: " + Description();
//   ResultAdded: ResultText in ResultColour (ignored results too);
//   TransientMessage: the message;  ChecksCompleted: ChecksCompletedText.
// Initializing calls the clearer (a new run starts a new log); CheckCompleted and
// VerificationCancelled log nothing.
class LogWriter : public INotificationClient {
  public:
    using Sink = std::function<void(const LogLine& line)>;
    using Clearer = std::function<void()>;

    explicit LogWriter(Sink sink, Clearer clearer = {});

    void CheckAdded(ICheck& check) override;
    void CheckCompleted(ICheck& check) override;
    void Checking(ICheck& check) override;
    void ChecksCompleted(bool cancelled) override;
    void Initializing() override;
    void ResultAdded(const ResultPtr& result) override;
    void TransientMessage(const std::string& message) override;
    void VerificationCancelled() override;

  private:
    void Write(std::string text, Colour colour = kBlack);

    Sink sink_;
    Clearer clearer_;
};

}  // namespace vtr::OutputLog
