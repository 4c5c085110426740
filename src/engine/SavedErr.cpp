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
    } catch (const std::exception& error) {
        description_ = error.what();
        other_ = current;
    } catch (...) {
        other_ = current;
    }
}

void SavedErr::Raise() const {
    if (other_)
        std::rethrow_exception(other_);
    throw VtrError(number_, source_, description_, helpFile_, helpContext_);
}

}  // namespace vtr
