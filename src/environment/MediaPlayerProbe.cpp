#include "environment/MediaPlayerProbe.h"

#include <charconv>
#include <utility>
#include <vector>

#include "engine/VtrError.h"
#include "environment/LibRegistryVTRShared.h"

#ifdef _WIN32
#include <windows.h>
// windows.h first: the COM headers need its definitions.
#include <objbase.h>
#include <oleauto.h>
#include <wmp.h>
#endif

namespace vtr::MediaPlayerProbe {
namespace {

#ifdef _WIN32
// COM failures are reported under this source; only Windows asks the player itself.
constexpr const char* kSource = "MediaPlayerProbe.VersionText";
constexpr const char* kControlProgId = "WMPlayer.OCX";
#endif

VersionSource& InstalledSource() {
    static VersionSource source;
    return source;
}

std::vector<std::string> Split(const std::string& text, char separator) {
    std::vector<std::string> parts;
    std::string::size_type start = 0;
    while (true) {
        const auto end = text.find(separator, start);
        if (end == std::string::npos) {
            parts.push_back(text.substr(start));
            return parts;
        }
        parts.push_back(text.substr(start, end - start));
        start = end + 1;
    }
}

#ifdef _WIN32

// Calls Release on a COM interface when it goes out of scope.
template <typename T>
class ComRef {
  public:
    ComRef() = default;
    ~ComRef() {
        if (pointer_ != nullptr)
            pointer_->Release();
    }
    ComRef(const ComRef&) = delete;
    ComRef& operator=(const ComRef&) = delete;
    T** Receive() { return &pointer_; }
    T* operator->() const { return pointer_; }

  private:
    T* pointer_ = nullptr;
};

// Balances a successful CoInitializeEx (including S_FALSE, "already initialised").
class ComApartment {
  public:
    ComApartment() : result_(CoInitializeEx(nullptr, COINIT_APARTMENTTHREADED)) {}
    ~ComApartment() {
        if (SUCCEEDED(result_))
            CoUninitialize();
    }
    ComApartment(const ComApartment&) = delete;
    ComApartment& operator=(const ComApartment&) = delete;

  private:
    HRESULT result_;
};

[[noreturn]] void RaiseComFailure(const char* step, HRESULT result) {
    char code[16];
    wsprintfA(code, "%08lX", static_cast<unsigned long>(result));
    Raise(ErrorNumbers::ObjectNotSet, kSource, std::string(step) + " failed (0x" + code + ")");
}

// The failures that mean the control is not installed at all, as opposed to one that is
// there but cannot be created or asked.
bool IsMissingControl(HRESULT result) {
    return result == CO_E_CLASSSTRING || result == REGDB_E_CLASSNOTREG ||
           result == HRESULT_FROM_WIN32(ERROR_MOD_NOT_FOUND) ||
           result == HRESULT_FROM_WIN32(ERROR_FILE_NOT_FOUND);
}

std::string ToAnsi(BSTR text) {
    std::string result;
    const int length = text != nullptr ? static_cast<int>(SysStringLen(text)) : 0;
    if (length == 0)
        return result;
    const int bytes = WideCharToMultiByte(CP_ACP, 0, text, length, nullptr, 0, nullptr, nullptr);
    if (bytes <= 0)
        return result;
    result.resize(bytes);
    WideCharToMultiByte(CP_ACP, 0, text, length, result.data(), bytes, nullptr, nullptr);
    return result;
}

#endif

}  // namespace

#ifdef _WIN32
std::string ControlVersionText(const std::string& progId) {
    ComApartment apartment;
    const int chars = MultiByteToWideChar(CP_ACP, 0, progId.c_str(), -1, nullptr, 0);
    std::wstring wideProgId(chars > 0 ? chars : 1, L'\0');
    if (chars > 0)
        MultiByteToWideChar(CP_ACP, 0, progId.c_str(), -1, wideProgId.data(), chars);

    CLSID classId;
    HRESULT result = CLSIDFromProgID(wideProgId.c_str(), &classId);
    if (IsMissingControl(result))
        return "";
    if (FAILED(result))
        RaiseComFailure("Finding the media player control", result);
    ComRef<IUnknown> control;
    result = CoCreateInstance(classId, nullptr, CLSCTX_INPROC_SERVER, IID_IUnknown,
                              reinterpret_cast<void**>(control.Receive()));
    if (IsMissingControl(result))
        return "";
    if (FAILED(result))
        RaiseComFailure("Creating the media player control", result);
    // The property belongs to the control's core interface, which every version of the
    // control has; asking it there needs no type information, unlike asking by name.
    ComRef<IWMPCore> core;
    result = control->QueryInterface(__uuidof(IWMPCore), reinterpret_cast<void**>(core.Receive()));
    if (FAILED(result))
        RaiseComFailure("Asking the control for its core interface", result);
    BSTR version = nullptr;
    result = core->get_versionInfo(&version);
    if (FAILED(result))
        RaiseComFailure("Reading versionInfo", result);
    const std::string text = ToAnsi(version);
    SysFreeString(version);
    return text;
}
#endif

std::string StoredVersionText() {
    return LibRegistryVTRShared::GetSharedString("VersionInfo", "MediaPlayer", "");
}

VersionSource SetVersionSource(VersionSource source) {
    std::swap(source, InstalledSource());
    return source;
}

std::string VersionText() {
    if (const VersionSource& source = InstalledSource())
        return source();
#ifdef _WIN32
    return ControlVersionText(kControlProgId);
#else
    return StoredVersionText();
#endif
}

bool IsVersionAtLeast(int32_t minimumMajor) {
    std::string text;
    if (!ResumeStep([&] { text = VersionText(); }))
        return false;
    return IsVersionTextAtLeast(text, minimumMajor);
}

bool IsVersionTextAtLeast(const std::string& versionText, int32_t minimumMajor) {
    if (minimumMajor <= 0)
        return true;
    const std::vector<std::string> parts = Split(versionText, '.');
    if (parts.size() != 4)
        return false;
    const std::string& major = parts[0];
    int32_t value = 0;
    const char* end = major.data() + major.size();
    const auto [stop, error] = std::from_chars(major.data(), end, value);
    // Canonical: the whole part is the number, and writing the number gives the part back.
    if (error != std::errc{} || stop != end || std::to_string(value) != major)
        return false;
    return value >= minimumMajor;
}

}  // namespace vtr::MediaPlayerProbe
