#include "engine/SavedErr.h"

#include "engine/VtrError.h"

namespace vtr {

SavedErr::SavedErr() {
    std::exception_ptr current = std::current_exception();
    if (!current)
        return;
    try {
        std::rethrow_exception(current);
    } catch (const VtrError& error) {
        description_ = error.Description();
        helpContext_ = error.HelpContext();
        helpFile_ = error.HelpFile();
        number_ = error.Number();
        source_ = error.Source();
    } catch (...) {
        // Kept whole, to be raised again as it was; a standard exception's text is shown.
        description_ = DescribeException(current, "");
        other_ = current;
    }
}

void SavedErr::Raise() const {
    if (other_)
        std::rethrow_exception(other_);
    throw VtrError(number_, source_, description_, helpFile_, helpContext_);
}

}  // namespace vtr
