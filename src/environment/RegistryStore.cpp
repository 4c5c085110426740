#include "environment/RegistryStore.h"

#include "engine/VtrError.h"

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

Origin& InstalledOrigin() {
    static Origin origin = Origin::Option;
    return origin;
}

std::string Environment(const char* name) {
    const char* value = std::getenv(name);
    return value != nullptr ? std::string(value) : std::string();
}

std::unique_ptr<Backend> Choose(const std::optional<std::string>& fileOption, Origin& origin) {
    if (fileOption && !fileOption->empty()) {
        origin = Origin::Option;
        return OpenFileStore(*fileOption);
    }
    const std::string named = Environment("VANTORI_REGISTRY");
    if (!named.empty()) {
        origin = Origin::Environment;
        return OpenFileStore(named);
    }
#ifdef _WIN32
    origin = Origin::Registry;
    return OpenWindowsRegistry();
#else
    origin = Origin::UserDefault;
    return OpenFileStore(DefaultStoreFile());
#endif
}

[[noreturn]] void RaiseFailure(Backend& store, Status status) {
    std::string description = store.Failure();
    if (description.empty()) {
        const auto file = store.File();
        description = (file ? "the settings store " + *file : std::string("the registry")) +
                      " could not be changed (status " + std::to_string(status) + ")";
    }
    Raise(kStoreErrorNumber, "RegistryStore", description);
}

}  // namespace

void Select(const std::optional<std::string>& fileOption) {
    Installed() = Choose(fileOption, InstalledOrigin());
}

std::optional<std::string> CurrentFile() {
    return Current().File();
}

Backend& Current() {
    if (!Installed())
        Installed() = Choose(std::nullopt, InstalledOrigin());
    return *Installed();
}

std::unique_ptr<Backend> Install(std::unique_ptr<Backend> backend, Origin origin) {
    std::swap(backend, Installed());
    InstalledOrigin() = origin;
    return backend;
}

Description Describe() {
    Backend& store = Current();
    Description description;
    description.file = store.File();
    description.origin = InstalledOrigin();
    description.condition = store.Examine();
    return description;
}

std::string Description::Name() const {
    return file ? "the settings store " + *file
                : std::string("the Windows registry (HKEY_CURRENT_USER)");
}

std::string Description::HowChosen() const {
    switch (origin) {
        case Origin::Option:
            return "named with --registry";
        case Origin::Environment:
            return "named by VANTORI_REGISTRY";
        case Origin::UserDefault:
            return "the per-user default, as neither --registry nor VANTORI_REGISTRY names one";
        case Origin::Registry:
            return "the Windows registry, as neither --registry nor VANTORI_REGISTRY names a file";
    }
    return {};
}

std::string Description::OriginWord() const {
    switch (origin) {
        case Origin::Option:
            return "option";
        case Origin::Environment:
            return "environment";
        case Origin::UserDefault:
            return "default";
        case Origin::Registry:
            return "registry";
    }
    return {};
}

std::string Description::Problem() const {
    if (!file)
        return {};
    const std::string which = Name() + " (" + HowChosen() + ")";
    if (!condition.exists) {
        return which +
               " does not exist; verifying with no settings. Name the suite's exported settings "
               "with --registry FILE or the environment variable VANTORI_REGISTRY.";
    }
    if (!condition.understood) {
        return which + " exists but could not be read as a registry export (" + condition.problem +
               "); verifying with no settings. Export the suite's settings again, or name "
               "another file with --registry FILE or VANTORI_REGISTRY.";
    }
    return {};
}

Changes::Changes() {
    Backend& store = Current();
    if (const Status status = store.BeginChanges())
        RaiseFailure(store, status);
    store_ = &store;
}

Changes::~Changes() {
    if (store_ != nullptr)
        store_->AbortChanges();
}

void Changes::Commit() {
    if (store_ == nullptr)
        return;
    Backend& store = *std::exchange(store_, nullptr);
    if (const Status status = store.CommitChanges())
        RaiseFailure(store, status);
}

ReadScope::ReadScope() : store_(&Current()) {
    store_->BeginReading();
}

ReadScope::~ReadScope() {
    store_->EndReading();
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
