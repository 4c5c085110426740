// What the piece reader holds while it reads: a piece and the markup item in hand, never the
// text around them, however long it is.
#include <gtest/gtest.h>

#include <algorithm>
#include <cstring>
#include <string>
#include <string_view>
#include <utility>

#include "sequencelib/LoadFailure.h"
#include "sequencelib/XmlPieceReader.h"

namespace vtr::seqlib::detail {
namespace {

constexpr std::size_t kMiB = std::size_t{1} << 20;

// A text made as it is read: `head`, `filler` over and over for about `fillerBytes` (whole
// rounds), then `tail`.
class MadeText final : public ByteSource {
  public:
    MadeText(std::string head, const std::string& filler, std::uint64_t fillerBytes,
             std::string tail)
        : head_(std::move(head)),
          tail_(std::move(tail)),
          fillerEnd_(head_.size() + fillerBytes / filler.size() * filler.size()),
          total_(fillerEnd_ + tail_.size()) {
        while (block_.size() < 65536)
            block_ += filler;
    }

    std::size_t Read(char* buffer, std::size_t size) override {
        std::size_t got = 0;
        while (got < size && done_ < total_) {
            std::string_view part;
            if (done_ < head_.size()) {
                part = std::string_view(head_).substr(done_);
            } else if (done_ < fillerEnd_) {
                const std::uint64_t inFiller = done_ - head_.size();
                part = std::string_view(block_).substr(inFiller % block_.size());
                part = part.substr(0, std::min<std::uint64_t>(part.size(), fillerEnd_ - done_));
            } else {
                part = std::string_view(tail_).substr(done_ - fillerEnd_);
            }
            const std::size_t n = std::min(size - got, part.size());
            std::memcpy(buffer + got, part.data(), n);
            got += n;
            done_ += n;
        }
        return got;
    }
    std::uint64_t FileBytesConsumed() const override { return done_; }
    std::uint64_t FileBytesTotal() const override { return total_; }

  private:
    std::string head_, tail_, block_;
    std::uint64_t fillerEnd_, total_;
    std::uint64_t done_ = 0;
};

class CountingHandler final : public XmlPieceHandler {
  public:
    void EnterElement(const XmlElements&) override { ++entered; }
    void CompleteElements(const XmlElements& elements) override {
        for (uint32_t i = 0; i < elements.Size(); i = elements[i].end)
            ++completed;
    }
    void LeaveElement() override { ++left; }
    int entered = 0, completed = 0, left = 0;
};

// Reads the text in pieces of a megabyte; the most the reader held.
std::size_t HeldReading(MadeText text, CountingHandler& handler) {
    XmlPieceReader::Options options;
    options.pieceBytes = kMiB;
    XmlPieceReader reader(text, options);
    try {
        reader.Run(handler, {});
    } catch (const LoadFailure& failure) {
        ADD_FAILURE() << failure.where << ": " << failure.cause;
    }
    return reader.BufferBytes();
}

TEST(PieceReaderMemory, WhatStandsBeforeTheRootIsReadAndForgotten) {
    struct Case {
        const char* filler;
        std::uint64_t bytes;
    };
    for (const Case& c : {Case{" \r\n\t", std::uint64_t{160} * kMiB},
                          Case{"<!-- a comment before the sequence -->\n", 8 * kMiB},
                          Case{"<?note about the file?>", 2 * kMiB}}) {
        CountingHandler handler;
        const std::size_t held = HeldReading(
            MadeText("<?xml version=\"1.0\"?>\n", c.filler, c.bytes, "<sequence><a/></sequence>"),
            handler);
        EXPECT_EQ(handler.entered, 1) << c.filler;
        EXPECT_EQ(handler.completed, 1) << c.filler;
        EXPECT_LE(held, 8 * kMiB) << c.filler;
    }
}

TEST(PieceReaderMemory, TextAndNodesInsideTheRootAreHeldAPieceAtATime) {
    for (const char* filler : {"text between the tags ", "<event start=\"0\" end=\"5\"/>\n",
                               "<!-- c --><?pi x?><![CDATA[ <x> ]]>"}) {
        CountingHandler handler;
        const std::size_t held = HeldReading(
            MadeText("<sequence>", filler, std::uint64_t{48} * kMiB, "</sequence>"), handler);
        EXPECT_EQ(handler.left, 1) << filler;
        EXPECT_LE(held, 8 * kMiB) << filler;
    }
}

}  // namespace
}  // namespace vtr::seqlib::detail
