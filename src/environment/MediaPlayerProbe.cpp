#include "environment/MediaPlayerProbe.h"

#include <charconv>
#include <vector>

#include "engine/VtrError.h"

#ifdef _WIN32
#include <objbase.h>
#include <oleauto.h>
#include <windows.h>
#else
#include "environment/LibRegistryVTRShared.h"
#endif

namespace vtr::MediaPlayerProbe {
namespace {

constexpr const char* kSource = "MediaPlayerProbe.VersionText";

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

// The control's versionInfo property, asked for by name through its dispatch interface.
std::string ReadControlVersion() {
    ComApartment apartment;
    CLSID classId;
    HRESULT result = CLSIDFromProgID(L"WMPlayer.OCX", &classId);
    if (FAILED(result))
        RaiseComFailure("Finding the media player control", result);
    ComRef<IDispatch> player;
    result = CoCreateInstance(classId, nullptr, CLSCTX_INPROC_SERVER, IID_IDispatch,
                              reinterpret_cast<void**>(player.Receive()));
    if (FAILED(result))
        RaiseComFailure("Creating the media player control", result);

    OLECHAR name[] = L"versionInfo";
    LPOLESTR names[] = {name};
    DISPID dispatchId = 0;
    result = player->GetIDsOfNames(IID_NULL, names, 1, LOCALE_USER_DEFAULT, &dispatchId);
    if (FAILED(result))
        RaiseComFailure("Finding versionInfo", result);
    DISPPARAMS noArguments{nullptr, nullptr, 0, 0};
    VARIANT value;
    VariantInit(&value);
    result = player->Invoke(dispatchId, IID_NULL, LOCALE_USER_DEFAULT, DISPATCH_PROPERTYGET,
                            &noArguments, &value, nullptr, nullptr);
    if (FAILED(result))
        RaiseComFailure("Reading versionInfo", result);
    result = VariantChangeType(&value, &value, 0, VT_BSTR);
    if (FAILED(result)) {
        VariantClear(&value);
        RaiseComFailure("Reading versionInfo as text", result);
    }
    std::string text;
    const int length = SysStringLen(value.bstrVal);
    if (length > 0) {
        const int bytes =
            WideCharToMultiByte(CP_ACP, 0, value.bstrVal, length, nullptr, 0, nullptr, nullptr);
        text.resize(bytes > 0 ? bytes : 0);
        if (bytes > 0) {
            WideCharToMultiByte(CP_ACP, 0, value.bstrVal, length, text.data(), bytes, nullptr,
                                nullptr);
        }
    }
    VariantClear(&value);
    return text;
}

#endif

}  // namespace

std::string VersionText() {
#ifdef _WIN32
    return ReadControlVersion();
#else
    return LibRegistryVTRShared::GetSharedString("VersionInfo", "MediaPlayer", "");
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
