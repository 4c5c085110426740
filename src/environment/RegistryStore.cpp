#include "environment/RegistryStore.h"

#include <cstdlib>
#include <filesystem>
#include <utility>

#ifndef _WIN32
#include <pwd.h>
#include <unistd.h>
#endif

namespace vtr::RegistryStore {
namespace {

std::unique_ptr<Backend>& Installed() {
    static std::unique_ptr<Backend> backend;
    return backend;
}

std::string Environment(const char* name) {
    const char* value = std::getenv(name);
    return value != nullptr ? std::string(value) : std::string();
}

std::unique_ptr<Backend> Choose(const std::optional<std::string>& fileOption) {
    if (fileOption && !fileOption->empty())
        return OpenFileStore(*fileOption);
    const std::string named = Environment("VANTORI_REGISTRY");
    if (!named.empty())
        return OpenFileStore(named);
#ifdef _WIN32
    return OpenWindowsRegistry();
#else
    return OpenFileStore(DefaultStoreFile());
#endif
}

}  // namespace

void Select(const std::optional<std::string>& fileOption) {
    Installed() = Choose(fileOption);
}

std::optional<std::string> CurrentFile() {
    return Current().File();
}

Backend& Current() {
    if (!Installed())
        Installed() = Choose(std::nullopt);
    return *Installed();
}

std::unique_ptr<Backend> Install(std::unique_ptr<Backend> backend) {
    std::swap(backend, Installed());
    return backend;
}

std::string DefaultStoreFile() {
    namespace fs = std::filesystem;
    fs::path config(Environment("XDG_CONFIG_HOME"));
    if (config.empty() || !config.is_absolute()) {
#ifdef _WIN32
        config = fs::path(Environment("APPDATA"));
#else
        std::string home = Environment("HOME");
        if (home.empty()) {
            if (const passwd* user = ::getpwuid(::getuid()))
                home = user->pw_dir;
        }
        config = fs::path(home) / ".config";
#endif
    }
    return (config / "vantori" / "registry.reg").string();
}

}  // namespace vtr::RegistryStore
