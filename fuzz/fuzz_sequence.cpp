// Sequence files ("lms", "las"). The loader reads a document of any size a piece at a time;
// how the text is cut into pieces must not matter. Every input is loaded twice, once in one
// piece and once in small pieces, and both loads must agree: both fail, or both keep the
// same channels, tracks, intensity files, media and shell command.
//
// The first byte of the input picks the small piece size; the rest is the file.

#include <cstdint>
#include <string>

#include "FuzzSupport.h"
#include "SequenceSummary.h"

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, std::size_t size) {
    std::string_view input = vtr::fuzz::AsText(data, size);
    static constexpr std::size_t kPieces[] = {16, 24, 40, 64, 100, 256, 1024, 4096};
    const std::size_t piece = kPieces[vtr::fuzz::TakeByte(input) % 8];
    const std::string path = vtr::fuzz::ScratchFolder::Instance().Write("fuzz.lms", input);

    vtr::seqlib::LoadOptions whole;
    whole.maxExpandedBytes = std::uint64_t{8} << 20;
    vtr::seqlib::LoadOptions pieces = whole;
    pieces.pieceBytes = piece;

    const std::string context = "file: " + vtr::fuzz::Printable(input);
    const std::string one = vtr::fuzz::LoadSummary(path, whole, context);
    const std::string many = vtr::fuzz::LoadSummary(path, pieces, context);
    VTR_FUZZ_CHECK(one == many, context + "\npieces of " + std::to_string(piece) +
                                    "\nin one piece: " + one + "\nin pieces: " + many);
    return 0;
}
