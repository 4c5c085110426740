#pragma once

#include <chrono>
#include <cstddef>
#include <cstdint>
#include <functional>
#include <iosfwd>
#include <string>

namespace vtr::cli {

// The one-line progress display on a terminal:
//   "<performed> checks performed, <remaining> remaining: <current check>"
// cut to the terminal's width. Updates only record the state; the line is redrawn at most
// once per interval (from Tick, which the event pump calls), so a run of thousands of checks
// does not flood the terminal. The line is rewritten in place with a carriage return and
// blanks, which every terminal understands.
class ProgressLine {
  public:
    using Clock = std::function<std::chrono::steady_clock::time_point()>;

    ProgressLine(std::ostream& out, int columns, Clock clock = {},
                 std::chrono::milliseconds interval = std::chrono::milliseconds(100));

    void SetCounts(int32_t performed, int32_t remaining);
    void SetCurrent(const std::string& description);
    // Redraws when the state changed and the interval has passed since the last drawing.
    void Tick();
    // Removes the line (before other output, and at the end). The next Tick draws it again.
    void Erase();

    // The text that would be drawn now, already cut to the width.
    std::string Text() const;

  private:
    void Draw();

    std::ostream& out_;
    std::size_t width_;
    Clock clock_;
    std::chrono::milliseconds interval_;
    std::chrono::steady_clock::time_point lastDrawn_{};
    bool everDrawn_ = false;
    bool dirty_ = false;
    std::size_t shownLength_ = 0;  // characters on screen now (0 when erased)

    int32_t performed_ = 0;
    int32_t remaining_ = 0;
    std::string current_;
};

// The first characters of a UTF-8 text that fit in the given number of columns, one column
// per character; a character is never cut in the middle.
std::string FitToColumns(const std::string& text, std::size_t columns);
// The number of characters (code points) of a UTF-8 text.
std::size_t CharacterCount(const std::string& text);

}  // namespace vtr::cli
