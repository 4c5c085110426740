// Edit files ("vtredit", and "vtrprot" when gzip-compressed) through the sequence-information
// service. Any bytes give no record (not readable, not an edit file) or a record that
// either names its playback file, taken against the edit file's folder, or holds the one
// problem "No playback file named".
//
// The first byte of the input, when odd, has the rest compressed before it is written.

#include <cstdint>
#include <string>

#include "FuzzSupport.h"
#include "sequencelib/SequenceInfo.h"
#include "vtrsupport/SequenceGenerator.h"

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, std::size_t size) {
    std::string_view input = vtr::fuzz::AsText(data, size);
    const bool compressed = vtr::fuzz::TakeByte(input) & 1;
    auto& scratch = vtr::fuzz::ScratchFolder::Instance();
    const std::string path =
        compressed ? scratch.Write("edit.vtrprot", vtr::seqlib::SequenceGenerator::Gzip(input))
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
