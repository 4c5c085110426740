#include "support/TempStore.h"

#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <system_error>

#include "environment/VTRCommon.h"

#ifndef _WIN32
#include <unistd.h>
#endif

namespace vtr::testsupport {

namespace fs = std::filesystem;

TempFolder::TempFolder() {
    const fs::path base = fs::temp_directory_path();
#ifdef _WIN32
    for (int i = 0;; ++i) {
        fs::path candidate = base / ("vtr-test-" + std::to_string(std::rand()) + std::to_string(i));
        if (fs::create_directory(candidate)) {
            path_ = candidate.string();
            break;
        }
    }
#else
    std::string pattern = (base / "vtr-test-XXXXXX").string();
    if (::mkdtemp(pattern.data()) == nullptr)
        throw std::runtime_error("mkdtemp failed");
    path_ = pattern;
#endif
}

TempFolder::~TempFolder() {
    std::error_code error;
    fs::remove_all(path_, error);
}

std::string TempFolder::File(const std::string& name) const {
    return (fs::path(path_) / name).string();
}

ScopedStore::ScopedStore(const std::string& file)
    : ScopedStore(RegistryStore::OpenFileStore(file)) {}

ScopedStore::ScopedStore(std::unique_ptr<RegistryStore::Backend> backend)
    : previous_(RegistryStore::Install(std::move(backend))) {
    VTRCommon::ResetCachedFolders();
}

ScopedStore::~ScopedStore() {
    RegistryStore::Install(std::move(previous_));
    VTRCommon::ResetCachedFolders();
}

namespace {

void SetVariable(const std::string& name, const std::optional<std::string>& value) {
#ifdef _WIN32
    _putenv_s(name.c_str(), value ? value->c_str() : "");
#else
    if (value) {
        ::setenv(name.c_str(), value->c_str(), 1);
    } else {
        ::unsetenv(name.c_str());
    }
#endif
}

}  // namespace

ScopedEnvironment::ScopedEnvironment(const std::string& name,
                                     const std::optional<std::string>& value)
    : name_(name) {
    if (const char* old = std::getenv(name.c_str()))
        previous_ = old;
    SetVariable(name_, value);
}

ScopedEnvironment::~ScopedEnvironment() {
    SetVariable(name_, previous_);
}

std::string ReadFileBytes(const std::string& path) {
    std::ifstream in(path, std::ios::binary);
    return std::string(std::istreambuf_iterator<char>(in), std::istreambuf_iterator<char>());
}

void WriteFileBytes(const std::string& path, const std::string& bytes) {
    std::ofstream out(path, std::ios::binary | std::ios::trunc);
    out.write(bytes.data(), static_cast<std::streamsize>(bytes.size()));
    if (!out)
        throw std::runtime_error("cannot write " + path);
}

StoreTest::StoreTest()
    : storeFile_(folder_.File("registry.reg")),
      store_(storeFile_),
      tmpdir_("TMPDIR", folder_.File("tmp"))
#ifdef _WIN32
      ,
      tmp_("TMP", folder_.File("tmp")),
      localAppDataVariable_("LOCALAPPDATA", localAppData_.Path()),
      mediaPlayer_(MediaPlayerProbe::StoredVersionText)
#endif
{
    fs::create_directories(TempDir());
}

}  // namespace vtr::testsupport
