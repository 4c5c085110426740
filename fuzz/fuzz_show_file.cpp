// The show file reader: any text gives a show or nothing, never an error or a crash. A show
// that was read and can be written is written to a text that reads back to the same show:
// writing what was read again gives that text unchanged.

#include <cstdint>
#include <optional>
#include <string>

#include "FuzzSupport.h"
#include "engine/VtrError.h"
#include "show/Show.h"

namespace {

using vtr::fuzz::Printable;

std::optional<std::string> Written(const vtr::Show& show) {
    try {
        return vtr::ShowFunctions::ShowToText(show);
    } catch (const vtr::VtrError&) {
        return std::nullopt;  // a part that cannot be written (a group without sets)
    }
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, std::size_t size) {
    const std::string_view text = vtr::fuzz::AsText(data, size);
    vtr::ShowPtr show;
    try {
        show = vtr::ShowFunctions::ShowFromText(text);
    } catch (const vtr::VtrError& e) {
        vtr::fuzz::Fail("the show reader never raises", Printable(text) + "\n" + e.Description());
    }
    if (!show)
        return 0;
    const std::optional<std::string> first = Written(*show);
    if (!first)
        return 0;
    const vtr::ShowPtr again = vtr::ShowFunctions::ShowFromText(*first);
    VTR_FUZZ_CHECK(again != nullptr,
                   "read: " + Printable(text) + "\nwritten: " + Printable(*first));
    const std::optional<std::string> second = Written(*again);
    VTR_FUZZ_CHECK(second == first, "read: " + Printable(text) + "\nwritten: " + Printable(*first) +
                                        "\nwritten again: " + Printable(second.value_or("(none)")));
    VTR_FUZZ_CHECK(show->HasSameContents(*again), "read: " + Printable(text));
    return 0;
}
