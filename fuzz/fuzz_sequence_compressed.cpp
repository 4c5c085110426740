// Compressed sequence files: gzip data (first bytes 1F 8B) holding the sequence's XML, read
// whatever the file's extension. Two kinds of input:
//   - first byte even: the rest is a sequence's text, compressed here; the compressed file
//     must load exactly as the plain one does (both fail, or both keep the same sequence);
//   - first byte odd: the rest is taken as gzip data as it stands (damaged, truncated,
//     several members, expanding far beyond its size); the load must fail cleanly or keep a
//     sequence, and expansion past the limit is refused.

#include <cstdint>
#include <string>

#include "FuzzSupport.h"
#include "SequenceSummary.h"
#include "vtrsupport/SequenceGenerator.h"

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, std::size_t size) {
    std::string_view input = vtr::fuzz::AsText(data, size);
    const uint8_t mode = vtr::fuzz::TakeByte(input);
    auto& scratch = vtr::fuzz::ScratchFolder::Instance();
    const std::string context = "input: " + vtr::fuzz::Printable(input);

    vtr::seqlib::LoadOptions options;
    options.maxExpandedBytes = std::uint64_t{4} << 20;
    options.pieceBytes = (mode & 2) ? 64 : std::size_t{1} << 20;

    if ((mode & 1) == 0) {
        const std::string compressed = scratch.Write(
            "fuzz.las", vtr::seqlib::SequenceGenerator::Gzip(input, (mode >> 2) % 10));
        const std::string plain = scratch.Write("plain.las", input);
        std::string fromPlain = vtr::fuzz::LoadSummary(plain, options, context);
        const std::string fromCompressed = vtr::fuzz::LoadSummary(compressed, options, context);
        // A plain text that itself begins with the gzip signature is read as gzip data in the
        // plain file and as its compressed bytes in the other.
        if (input.size() >= 2 && input[0] == '\x1f' && input[1] == '\x8b')
            return 0;
        VTR_FUZZ_CHECK(fromPlain == fromCompressed,
                       context + "\nplain: " + fromPlain + "\ncompressed: " + fromCompressed);
        return 0;
    }
    std::string bytes("\x1f\x8b", 2);
    bytes.append(input.data(), input.size());
    const std::string path = scratch.Write("fuzz.las", bytes);
    (void)vtr::fuzz::LoadSummary(path, options, context);
    return 0;
}
