#pragma once

#include <gtest/gtest.h>

#include <memory>
#include <optional>
#include <string>

#include "environment/RegistryStore.h"

#ifdef _WIN32
#include "environment/MediaPlayerProbe.h"
#endif

// Test support for anything that touches files or the settings store. Tests never use the
// real user's settings or temporary files:
//
//   class MyTest : public vtr::testsupport::StoreTest {};   // a fresh, empty store per test
//   TEST_F(MyTest, ...) {
//       WriteStore("Windows Registry Editor Version 5.00\n\n[HKEY_CURRENT_USER\\...]\n...");
//       ... code under test reads and writes through LibRegistry ...
//       EXPECT_NE(ReadStore().find("\"AppPath\""), std::string::npos);
//   }
namespace vtr::testsupport {

// A new folder under the system's temporary folder, removed with its content at the end.
class TempFolder {
  public:
    TempFolder();
    ~TempFolder();
    TempFolder(const TempFolder&) = delete;
    TempFolder& operator=(const TempFolder&) = delete;

    const std::string& Path() const { return path_; }
    // The path of a name inside the folder (nothing is created).
    std::string File(const std::string& name) const;

  private:
    std::string path_;
};

// Puts the settings store kept in `file` in place for as long as the object lives, and the
// store that was in place back afterwards. The suite's cached folders (VTRCommon) are
// forgotten on both ends, so nothing read from one store leaks into the next test.
class ScopedStore {
  public:
    explicit ScopedStore(const std::string& file);
    // Any store of the test's own (a recording or failing one, say).
    explicit ScopedStore(std::unique_ptr<RegistryStore::Backend> backend);
    ~ScopedStore();
    ScopedStore(const ScopedStore&) = delete;
    ScopedStore& operator=(const ScopedStore&) = delete;

  private:
    std::unique_ptr<RegistryStore::Backend> previous_;
};

// Sets an environment variable (or unsets it, with nothing) for as long as the object lives.
class ScopedEnvironment {
  public:
    ScopedEnvironment(const std::string& name, const std::optional<std::string>& value);
    ~ScopedEnvironment();
    ScopedEnvironment(const ScopedEnvironment&) = delete;
    ScopedEnvironment& operator=(const ScopedEnvironment&) = delete;

  private:
    std::string name_;
    std::optional<std::string> previous_;
};

// The whole content of a file ("" when it cannot be read), and writing one whole.
std::string ReadFileBytes(const std::string& path);
void WriteFileBytes(const std::string& path, const std::string& bytes);

// A test with its own temporary folder, a store file "registry.reg" in it (missing until
// written: an empty store) selected for the test, and TMPDIR pointing into the folder so
// that temporary files land there too (on Windows TMP as well, which the system's
// temporary-folder service reads). On Windows the media player's version comes from the
// test's store, as it does elsewhere, rather than from the machine's own player.
class StoreTest : public ::testing::Test {
  protected:
    StoreTest();

    const std::string& StoreFile() const { return storeFile_; }
    void WriteStore(const std::string& bytes) const { WriteFileBytes(storeFile_, bytes); }
    std::string ReadStore() const { return ReadFileBytes(storeFile_); }
    // The folder TMPDIR names during the test.
    std::string TempDir() const { return folder_.File("tmp"); }

    TempFolder folder_;

  private:
#ifdef _WIN32
    // The user's local application data, where the store's writers keep their lock files
    // (made before TMP is changed, so not inside the test's temporary folder).
    TempFolder localAppData_;
#endif
    std::string storeFile_;
    ScopedStore store_;
    ScopedEnvironment tmpdir_;
#ifdef _WIN32
    ScopedEnvironment tmp_;
    ScopedEnvironment localAppDataVariable_;
    MediaPlayerProbe::ScopedVersionSource mediaPlayer_;
#endif
};

}  // namespace vtr::testsupport
