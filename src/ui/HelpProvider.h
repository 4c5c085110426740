#pragma once

#include <cstdint>
#include <memory>
#include <string>

#include "environment/FilesRead.h"

class QWidget;

namespace vtr {

// Opens the suite's help file on a topic. On Windows the system's help viewer shows the
// compiled help file; elsewhere the program's own viewer reads it.
class HelpProvider {
  public:
    virtual ~HelpProvider() = default;
    // Remembers the help file (its full path); nothing is opened yet. A file of the suite
    // the window reads: no report is ever saved over it (FilesRead).
    void Prepare(const std::string& helpFile) {
        helpFile_ = helpFile;
        FilesRead::RecordProgramFile(helpFile);
    }
    const std::string& HelpFile() const { return helpFile_; }
    // Shows the topic of a help-context id; a file without that id shows the verifier's own
    // page. Raises VtrError when the help file cannot be opened or shown.
    virtual void ShowContext(int32_t contextId) = 0;
    // Shows a page of the help file by its name ("Verifier.htm"). Raises VtrError on failure.
    virtual void ShowPage(const std::string& page) = 0;

    // The verifier's own page, opened when nothing more particular is asked for.
    static constexpr const char* kVerifierPage = "Verifier.htm";

  protected:
    std::string helpFile_;
};

// The help of this platform; owner is the window the help belongs to.
std::unique_ptr<HelpProvider> CreateHelpProvider(QWidget* owner);

}  // namespace vtr
