#include "sequencelib/TextWindow.h"

#include <algorithm>
#include <cstring>

#include "sequencelib/ByteScan.h"

namespace vtr::seqlib::detail {

TextWindow::TextWindow(ByteSource& source, std::size_t readBytes, std::function<void()> afterRead)
    : source_(source),
      readBytes_(std::max<std::size_t>(readBytes, 1)),
      afterRead_(std::move(afterRead)) {}

void TextWindow::MakeRoom() {
    if (capacity_ - size_ >= readBytes_)
        return;
    const std::size_t held = size_ - front_;
    // Forgotten bytes at the front are reclaimed first; the buffer grows only when what is
    // held leaves no room for a block.
    if (front_ > 0 && capacity_ - held >= readBytes_) {
        std::memmove(buffer_.get(), buffer_.get() + front_, held);
        front_ = 0;
        size_ = held;
        return;
    }
    // Room for a few blocks, so that what is held moves to the front once in a while.
    std::size_t grown = std::max<std::size_t>(capacity_, 4 * readBytes_);
    while (grown - held < readBytes_)
        grown *= 2;
    grown = std::max(grown, held + readBytes_);
    std::unique_ptr<char[]> bigger(new char[grown]);
    if (held > 0)
        std::memcpy(bigger.get(), buffer_.get() + front_, held);
    buffer_ = std::move(bigger);
    capacity_ = grown;
    front_ = 0;
    size_ = held;
}

bool TextWindow::ReadMore() {
    if (exhausted_)
        return false;
    MakeRoom();
    const std::size_t got = source_.Read(buffer_.get() + size_, readBytes_);
    if (afterRead_)
        afterRead_();
    if (got == 0) {
        exhausted_ = true;
        return false;
    }
    size_ += got;
    return true;
}

bool TextWindow::ReadUntil(int64_t offset) {
    while (offset >= End()) {
        if (!ReadMore())
            return false;
    }
    return true;
}

int64_t TextWindow::Find(int64_t from, char c, int64_t stop) {
    int64_t i = from;
    while (i < stop) {
        const int64_t end = std::min(End(), stop);
        if (i < end) {
            const char* const start = At(i);
            const char* const last = start + (end - i);
            const char* const hit = FindByte(start, last, c);
            if (hit != last)
                return i + (hit - start);
            i = end;
        }
        if (i >= stop || !ReadMore())
            break;
    }
    return npos;
}

int64_t TextWindow::Find(int64_t from, std::string_view text, int64_t stop) {
    const auto length = static_cast<int64_t>(text.size());
    int64_t i = from;
    while (i < stop) {
        if (End() >= i + length) {
            // Occurrences that start before stop; they may end after it.
            const int64_t end = std::min(End(), stop + length - 1);
            const std::string_view held = View(i, end);
            const std::size_t hit = held.find(text);
            if (hit != std::string_view::npos)
                return i + static_cast<int64_t>(hit);
            i = end - length + 1;
            if (end == stop + length - 1)
                break;
        }
        if (!ReadMore())
            break;
    }
    return npos;
}

bool TextWindow::StartsWith(int64_t at, std::string_view text) {
    return Have(at + static_cast<int64_t>(text.size()) - 1) &&
           std::memcmp(At(at), text.data(), text.size()) == 0;
}

void TextWindow::Drop(int64_t offset) {
    offset = std::clamp(offset, begin_, End());
    front_ += static_cast<std::size_t>(offset - begin_);
    begin_ = offset;
    if (front_ == size_)
        front_ = size_ = 0;
}

}  // namespace vtr::seqlib::detail
