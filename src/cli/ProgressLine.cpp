#include "ProgressLine.h"

#include <ostream>
#include <utility>

namespace vtr::cli {
namespace {

bool IsContinuationByte(char byte) {
    return (static_cast<unsigned char>(byte) & 0xC0) == 0x80;
}

}  // namespace

std::size_t CharacterCount(const std::string& text) {
    std::size_t count = 0;
    for (char byte : text)
        count += IsContinuationByte(byte) ? 0 : 1;
    return count;
}

std::string FitToColumns(const std::string& text, std::size_t columns) {
    std::size_t characters = 0;
    for (std::size_t i = 0; i < text.size(); ++i) {
        if (IsContinuationByte(text[i]))
            continue;
        if (characters == columns)
            return text.substr(0, i);
        ++characters;
    }
    return text;
}

ProgressLine::ProgressLine(std::ostream& out, int columns, Clock clock,
                           std::chrono::milliseconds interval)
    // The last column stays free: writing into it makes some terminals wrap the line.
    : out_(out),
      width_(columns > 1 ? static_cast<std::size_t>(columns - 1) : 1),
      clock_(clock ? std::move(clock) : Clock([] { return std::chrono::steady_clock::now(); })),
      interval_(interval) {}

void ProgressLine::SetCounts(int32_t performed, int32_t remaining) {
    if (performed != performed_ || remaining != remaining_) {
        performed_ = performed;
        remaining_ = remaining;
        dirty_ = true;
    }
}

void ProgressLine::SetCurrent(const std::string& description) {
    if (description != current_) {
        current_ = description;
        dirty_ = true;
    }
}

std::string ProgressLine::Text() const {
    std::string text = std::to_string(performed_) + (performed_ == 1 ? " check" : " checks") +
                       " performed, " + std::to_string(remaining_) + " remaining";
    if (!current_.empty())
        text += ": " + current_;
    return FitToColumns(text, width_);
}

void ProgressLine::Tick() {
    if (!dirty_ && shownLength_ > 0)
        return;
    const auto now = clock_();
    if (everDrawn_ && now - lastDrawn_ < interval_)
        return;
    lastDrawn_ = now;
    everDrawn_ = true;
    Draw();
}

void ProgressLine::Draw() {
    const std::string text = Text();
    const std::size_t length = CharacterCount(text);
    out_ << '\r' << text;
    if (shownLength_ > length)
        out_ << std::string(shownLength_ - length, ' ') << '\r' << text;
    out_.flush();
    shownLength_ = length;
    dirty_ = false;
}

void ProgressLine::Erase() {
    if (shownLength_ == 0)
        return;
    out_ << '\r' << std::string(shownLength_, ' ') << '\r';
    out_.flush();
    shownLength_ = 0;
}

}  // namespace vtr::cli
