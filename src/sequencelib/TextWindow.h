#pragma once

#include <cstddef>
#include <cstdint>
#include <functional>
#include <memory>
#include <string_view>

#include "sequencelib/ByteSource.h"

namespace vtr::seqlib::detail {

// The part of a text that is being read: bytes [Begin(), End()) of the decoded text, held in
// one buffer, read from the source a block at a time as they are asked for and forgotten
// from the front once the reader has used them. Offsets count from the start of the text.
//
// The window holds what its users ask for and nothing more: they bound every search (a
// piece, a markup item), so the buffer never grows with the input, only with those bounds.
class TextWindow {
  public:
    static constexpr int64_t npos = -1;

    // readBytes: how much is asked of the source at a time. afterRead, if set, is called
    // after every read from the source (the load's clock).
    TextWindow(ByteSource& source, std::size_t readBytes, std::function<void()> afterRead = {});
    TextWindow(const TextWindow&) = delete;
    TextWindow& operator=(const TextWindow&) = delete;

    int64_t Begin() const { return begin_; }
    int64_t End() const { return begin_ + static_cast<int64_t>(size_ - front_); }
    // The size of the buffer: the most the window has held at once, give or take a block.
    std::size_t Capacity() const { return capacity_; }
    // The bytes asked of the source at each read.
    std::size_t ReadBytes() const { return readBytes_; }
    // True once the source has no more data: End() is the end of the text.
    bool Exhausted() const { return exhausted_; }

    // Reads until the byte at `offset` is held; false when the text ends before it.
    bool Have(int64_t offset) { return offset < End() || ReadUntil(offset); }
    // Reads until `offset` is held or the text ends.
    void FillTo(int64_t offset) { ReadUntil(offset); }
    // Reads one more block; false at the end of the text.
    bool ReadMore();

    // The byte at a held offset, and the held bytes from a held offset on.
    char operator[](int64_t offset) const { return *At(offset); }
    const char* At(int64_t offset) const {
        return buffer_.get() + front_ + static_cast<std::size_t>(offset - begin_);
    }
    std::string_view View(int64_t from, int64_t to) const {
        return {At(from), static_cast<std::size_t>(to - from)};
    }

    // The first `c` in [from, stop), reading as needed; npos when there is none (the text
    // ends first, or stop is reached).
    int64_t Find(int64_t from, char c, int64_t stop);
    // The first occurrence of `text` starting in [from, stop), reading as needed.
    int64_t Find(int64_t from, std::string_view text, int64_t stop);
    // True when the held (or readable) bytes at `at` are `text`.
    bool StartsWith(int64_t at, std::string_view text);

    // Forgets the bytes before `offset` (held offsets only).
    void Drop(int64_t offset);

  private:
    bool ReadUntil(int64_t offset);
    void MakeRoom();

    ByteSource& source_;
    std::size_t readBytes_;
    std::function<void()> afterRead_;
    std::unique_ptr<char[]> buffer_;
    std::size_t capacity_ = 0;
    std::size_t front_ = 0;  // buffer_[front_] is the byte at begin_
    std::size_t size_ = 0;   // bytes of buffer_ in use, forgotten ones included
    int64_t begin_ = 0;
    bool exhausted_ = false;
};

}  // namespace vtr::seqlib::detail
