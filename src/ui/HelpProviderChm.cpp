#include <QPointer>

#include "ChmHelpFile.h"
#include "HelpProvider.h"
#include "HelpViewer.h"
#include "engine/VtrError.h"

namespace vtr {
namespace {

constexpr const char* kSource = "Help";

// Away from Windows: the help file is read with the CHM library and shown in the
// program's own viewer. The file is opened afresh for every request, so a help file
// installed or replaced while the window is open is picked up.
class ChmHelpProvider : public HelpProvider {
  public:
    explicit ChmHelpProvider(QWidget* owner) : owner_(owner) {}

    void ShowContext(int32_t contextId) override {
        auto file = Open();
        std::optional<std::string> page = file->PageForContext(contextId);
        if (!page)
            page = file->FindPage(kVerifierPage);
        if (!page)
            Raise(ErrorNumbers::UserMessage, kSource,
                  "The help file " + file->Path() + " has no topic for help context " +
                      std::to_string(contextId) + " and no page " + kVerifierPage);
        Viewer().ShowPage(std::move(file), *page);
    }

    void ShowPage(const std::string& page) override {
        auto file = Open();
        const std::optional<std::string> found = file->FindPage(page);
        if (!found)
            Raise(ErrorNumbers::UserMessage, kSource,
                  "The help file " + file->Path() + " has no page " + page);
        Viewer().ShowPage(std::move(file), *found);
    }

  private:
    std::shared_ptr<const ChmHelpFile> Open() const {
        if (helpFile_.empty())
            Raise(ErrorNumbers::UserMessage, kSource, "No help file has been prepared");
        return std::make_shared<const ChmHelpFile>(helpFile_);
    }

    HelpViewer& Viewer() {
        if (!viewer_)
            viewer_ = new HelpViewer(owner_);
        return *viewer_;
    }

    QWidget* owner_;
    QPointer<HelpViewer> viewer_;
};

}  // namespace

std::unique_ptr<HelpProvider> CreateHelpProvider(QWidget* owner) {
    return std::make_unique<ChmHelpProvider>(owner);
}

}  // namespace vtr
