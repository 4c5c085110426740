// Edit files ("vtredit", and "vtrprot" when gzip-compressed) through the sequence-information
// service. Any bytes give no record (not readable, not an edit file) or a record that
// either names its playback file, taken against the edit file's folder, or holds the one
// problem "No playback file named".
//
// The first byte of the input, when odd, has the rest compressed before it is written.

#include <zlib.h>

#include <cstdint>
#include <string>

#include "FuzzSupport.h"
#include "sequencelib/SequenceInfo.h"

namespace {

std::string Gzip(std::string_view bytes) {
    z_stream zs{};
    if (deflateInit2(&zs, Z_DEFAULT_COMPRESSION, Z_DEFLATED, 15 + 16, 8, Z_DEFAULT_STRATEGY) !=
        Z_OK) {
        vtr::fuzz::Fail("deflateInit2", "");
    }
    std::string out(deflateBound(&zs, static_cast<uLong>(bytes.size())) + 32, '\0');
    zs.next_in = reinterpret_cast<Bytef*>(const_cast<char*>(bytes.data()));
    zs.avail_in = static_cast<uInt>(bytes.size());
    zs.next_out = reinterpret_cast<Bytef*>(out.data());
    zs.avail_out = static_cast<uInt>(out.size());
    if (deflate(&zs, Z_FINISH) != Z_STREAM_END)
        vtr::fuzz::Fail("deflate", "");
    out.resize(zs.total_out);
    deflateEnd(&zs);
    return out;
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, std::size_t size) {
    std::string_view input = vtr::fuzz::AsText(data, size);
    const bool compressed = vtr::fuzz::TakeByte(input) & 1;
    auto& scratch = vtr::fuzz::ScratchFolder::Instance();
    const std::string path = compressed ? scratch.Write("edit.vtrprot", Gzip(input))
                                        : scratch.Write("edit.vtredit", input);
    const std::string context = "file: " + vtr::fuzz::Printable(input);

    const auto info = vtr::seqlib::SequenceInfoService().GetSequenceInfo(path);
    if (!info)
        return 0;
    if (info->ProblemCount() != 0) {
        VTR_FUZZ_CHECK(info->ProblemCount() == 1 && info->PlaybackFile().empty(), context);
        VTR_FUZZ_CHECK(info->ProblemTexts().size() == 2 &&
                           info->ProblemTexts()[0] == "[SEQUENCE]: " + path &&
                           info->ProblemTexts()[1] == "[PROBLEM]: No playback file named",
                       context);
        return 0;
    }
    const std::string& playback = info->PlaybackFile();
    VTR_FUZZ_CHECK(!playback.empty() && info->ProblemTexts().empty(), context);
    VTR_FUZZ_CHECK(vtr::seqlib::IsAbsolutePath(playback), context + "\nplayback: " + playback);
    // The same file read again gives the same record: nothing is kept between calls.
    const auto again = vtr::seqlib::SequenceInfoService().GetSequenceInfo(path);
    VTR_FUZZ_CHECK(again && again->PlaybackFile() == playback, context);
    return 0;
}
