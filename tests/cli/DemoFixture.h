#pragma once

#include <gtest/gtest.h>

#include <algorithm>
#include <filesystem>
#include <map>
#include <string>
#include <vector>

#include "DemoInstance.h"
#include "cli/CliTestSupport.h"
#include "engine/LibVerify.h"
#include "schedule/DateTime.h"
#include "support/TempStore.h"
#include "vtrsupport/PeImage.h"

namespace vtr::cli::testing {

// The separator the verifier puts between a folder and a name.
#ifdef _WIN32
inline constexpr char kSeparator = '\\';
#else
inline constexpr char kSeparator = '/';
#endif

// A test on its own instance of the demo installation, made in the test's folder with a fixed
// day of instantiation, with the clock set to that day (19:30:00) for the whole test.
class DemoTest : public testsupport::StoreTest {
  protected:
    static DateTime Now() { return DateTime::FromParts(2031, 3, 14, 19, 30, 0); }

    explicit DemoTest(const std::string& folderName = "demo")
        : demoFolder_(folder_.File(folderName)), clock_([] { return Now(); }) {
        demo::InstanceOptions options;
        options.today = Now().Date();
        options.writeAppFile = [](const std::string& path, const std::string& version) {
            testsupport::WritePeImage(path, version);
        };
        demo::Instantiate(VTR_SOURCE_DIR "/examples/demo", demoFolder_, options);
    }

    void TearDown() override {
        LibVerify::IgnoredMessageNumbers().Clear();
        LibVerify::IgnoredResultKeys().Clear();
        LibVerify::ClearResults();
    }

    // A path inside the instance.
    std::string Demo(const std::string& relative) const {
#ifdef _WIN32
        // The instance names its files with the system's separator on Windows.
        std::string native = relative;
        std::replace(native.begin(), native.end(), '/', '\\');
        return demoFolder_ + kSeparator + native;
#else
        return demoFolder_ + "/" + relative;
#endif
    }
    // A file of the application or media folder, as the verifier names it: the folder as the
    // store has it, then the platform's separator.
    std::string AppFile(const std::string& name) const {
        return Demo("app") + kSeparator + name;
    }
    std::string MediaFile(const std::string& name) const {
        return Demo("media") + kSeparator + name;
    }
    std::string DemoStore() const {
        return Demo("registry.reg");
    }

    // The command line with --registry naming the instance's store.
    Outcome Run(std::vector<std::string> arguments, bool terminal = false, int columns = 80,
                ProgressLine::Clock clock = {}) const {
        arguments.push_back("--registry");
        arguments.push_back(DemoStore());
        return RunMain(arguments, terminal, columns, std::move(clock));
    }

    // Every file of the instance with its bytes and time of last change.
    std::map<std::string, std::pair<std::string, std::filesystem::file_time_type>> Snapshot()
        const {
        std::map<std::string, std::pair<std::string, std::filesystem::file_time_type>> files;
        for (const auto& entry : std::filesystem::recursive_directory_iterator(demoFolder_)) {
            if (entry.is_regular_file()) {
                files[entry.path().string()] = {testsupport::ReadFileBytes(entry.path().string()),
                                                entry.last_write_time()};
            }
        }
        return files;
    }

    // What the test's temporary folder holds (the driver's temporary files land there).
    std::vector<std::string> TempFiles() const {
        std::vector<std::string> names;
        for (const auto& entry : std::filesystem::directory_iterator(TempDir()))
            names.push_back(entry.path().filename().string());
        return names;
    }

    std::string demoFolder_;

  private:
    ScopedNowSource clock_;
};

}  // namespace vtr::cli::testing
