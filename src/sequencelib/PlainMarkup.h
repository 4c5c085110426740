#pragma once

#include <cstdint>
#include <string_view>
#include <vector>

#include "sequencelib/XmlElements.h"

namespace vtr::seqlib::detail {

// Reads markup written the plainest way, as sequence files are written: elements whose
// attribute values and text hold no references and whose values hold no control characters,
// names of ASCII letters, digits, '_', '-', '.' and ':', and no comments, processing
// instructions, CDATA sections or DOCTYPEs. Such text means the same to pugixml, so it is
// read in one pass over the bytes with no parse tree.
//
// Anything else, well-formed or not, makes a scan give up having kept nothing: the text then
// goes the general way (the markup lexer, the cut finder and pugixml), which reads it or
// judges what is wrong with it.
class PlainMarkup {
  public:
    // The elements of `text`, a run of whole nodes that starts at the text offset `offset`,
    // into `out` (viewing `text`); false when the text is not plain markup.
    bool Scan(std::string_view text, int64_t offset, XmlElements& out);

    // How the cut finder cuts the content of the innermost open element (see CutFinder).
    struct Rules {
        int64_t limit = 0;         // the text offset where a piece is full
        int64_t descendBytes = 0;  // an element longer than this is entered
        int64_t depthLeft = 0;     // how much deeper than the open element may nest
    };
    struct Cut {
        enum class Kind { NotPlain, Piece, EndTag, Descend } kind = Kind::NotPlain;
        int64_t at = 0;      // the end of the piece, or where the end or start tag starts
        int64_t tagEnd = 0;  // one past the end or start tag
    };

    // The cut the cut finder would make next in the content that starts at `offset`, the
    // first byte of `text` (which holds at least up to the limit, unless the text ends
    // first), when the content up to it is plain markup: its whole elements into `out`, or
    // for Descend the element entered, with its attributes and no children.
    // NotPlain otherwise. When the scan gave up on an element (to enter it, or not plain),
    // `scanned` is the text offset where it did, else it is left as it was.
    Cut ScanContent(std::string_view text, int64_t offset, const Rules& rules, XmlElements& out,
                    int64_t& scanned);

  private:
    enum class Read { Whole, TooFar, NotPlain };
    // Reads the element whose '<' is at `where`, with its content, and moves past it. TooFar
    // when a '<' of it stands at or after `stop` (before anything that is not plain);
    // NotPlain when it is not plain markup, nests deeper than depthLeft, or the text ends
    // inside it.
    Read Element(const char*& where, const char* stop, int64_t depthLeft, XmlElements& out);

    const char* begin_ = nullptr;
    const char* end_ = nullptr;
    int64_t offset_ = 0;
    int64_t startTagEnd_ = 0;     // one past the start tag of the last element read
    std::vector<uint32_t> open_;  // the elements entered, innermost last
};

}  // namespace vtr::seqlib::detail
