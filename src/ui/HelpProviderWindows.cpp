// The HTML Help viewer of Windows, reached through hhctrl.ocx. Compiled on Windows only.
#ifndef NOMINMAX
#define NOMINMAX
#endif
#ifndef WIN32_LEAN_AND_MEAN
#define WIN32_LEAN_AND_MEAN
#endif
#include <windows.h>

#include <QWidget>

#include "HelpProvider.h"
#include "engine/VtrError.h"

namespace vtr {
namespace {

constexpr const char* kSource = "Help";
// The commands of the HTML Help API that the window uses.
constexpr UINT kDisplayTopic = 0x0000;
constexpr UINT kHelpContext = 0x000F;

using HtmlHelpFunction = HWND(WINAPI*)(HWND, LPCSTR, UINT, DWORD_PTR);

// The entry point is looked up at run time: the control is part of Windows, but an import
// library for it is not part of every tool chain.
HtmlHelpFunction HtmlHelpEntry() {
    static HtmlHelpFunction entry = [] {
        HMODULE module = ::LoadLibraryA("hhctrl.ocx");
        return module == nullptr ? nullptr
                                 : reinterpret_cast<HtmlHelpFunction>(reinterpret_cast<void*>(
                                       ::GetProcAddress(module, "HtmlHelpA")));
    }();
    return entry;
}

class HtmlHelpProvider : public HelpProvider {
  public:
    explicit HtmlHelpProvider(QWidget* owner) : owner_(owner) {}

    void ShowContext(int32_t contextId) override {
        // A help file without that id shows the verifier's own page, as elsewhere.
        if (Call(helpFile_, kHelpContext, static_cast<DWORD_PTR>(static_cast<uint32_t>(contextId))))
            return;
        ShowPage(kVerifierPage);
    }

    void ShowPage(const std::string& page) override {
        const std::string topic = helpFile_ + "::/" + page;
        if (!Call(topic, kDisplayTopic, 0))
            Raise(ErrorNumbers::UserMessage, kSource, "Cannot show the help topic " + topic);
    }

  private:
    bool Call(const std::string& file, UINT command, DWORD_PTR data) const {
        HtmlHelpFunction entry = HtmlHelpEntry();
        if (entry == nullptr)
            Raise(ErrorNumbers::UserMessage, kSource,
                  "The HTML Help viewer (hhctrl.ocx) is not available");
        if (helpFile_.empty())
            Raise(ErrorNumbers::UserMessage, kSource, "No help file has been prepared");
        HWND window = owner_ != nullptr ? reinterpret_cast<HWND>(owner_->winId()) : nullptr;
        return entry(window, file.c_str(), command, data) != nullptr;
    }

    QWidget* owner_;
};

}  // namespace

std::unique_ptr<HelpProvider> CreateHelpProvider(QWidget* owner) {
    return std::make_unique<HtmlHelpProvider>(owner);
}

}  // namespace vtr
