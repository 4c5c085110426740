// Whole verifications of generated installations of every shape, once loading the sequence
// files on the caller's thread alone and once on worker threads: what the user is told (every
// notification, the log's progress lines included, the results and their order, the JSON and
// the text of the results) must be the same bytes either way, also when the run is cancelled
// half way.

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <filesystem>
#include <functional>
#include <optional>
#include <regex>
#include <sstream>
#include <string>
#include <vector>

#include "ResultsOutput.h"
#include "engine/LibVerify.h"
#include "engine/ResultsReport.h"
#include "engine/SequencePrefetch.h"
#include "environment/VTRCommon.h"
#include "schedule/DateTime.h"
#include "support/TempStore.h"
#include "support/VerifierFixture.h"
#include "vtrsupport/InstallationGenerator.h"
#include "vtrsupport/PeImage.h"

namespace vtr {
namespace {

namespace fs = std::filesystem;

// What one run told the user.
struct Told {
    std::vector<std::string> notifications;
    std::string json;
    std::string text;
    std::string report;  // the results report's text, as the window saves it
    int32_t checksPerformed = 0;
    int32_t sequenceLoads = 0;
};

class ParallelLoading : public testsupport::StoreTest {
  protected:
    ~ParallelLoading() override {
        LibVerify::SetLoadingJobs(0);
        LibVerify::SetEventPump({});
        LibVerify::DeleteTempFiles();
        LibVerify::ClearResults();
    }

    // Writes an installation of that shape and puts its store in place.
    void Generate(const std::string& name, gen::InstallationOptions options) {
        options.calendarStart = DateTime::FromParts(2031, 3, 14, 0, 0, 0).Date();
        options.writeApplicationFile = [](const std::string& path, const std::string& version) {
            testsupport::WritePeImage(path, version);
        };
        installation_ = gen::MakeInstallation(folder_.File(name), options);
        store_.reset();
        store_.emplace(installation_.registryFile);
    }

    // Verifies the whole schedule with that many jobs; `cancelAt` cancels the run at that
    // pump of the user interface (0: never).
    Told Run(int jobs, int cancelAt = 0) {
        LibVerify::SetLoadingJobs(jobs);
        testsupport::RecordingClient client;
        int pumps = 0;
        LibVerify::SetEventPump([&] {
            if (++pumps == cancelAt)
                LibVerify::CancelVerification();
        });
        LibVerify::SetScheduleFiles(VTRCommon::GetWeeklyScheduleFile(),
                                    VTRCommon::GetYearlyScheduleFile());
        LibVerify::RunVerification();
        LibVerify::SetEventPump({});

        Told told;
        told.notifications = client.log;
        told.checksPerformed = LibVerify::ChecksPerformedCount();
        told.sequenceLoads = LibVerify::GetFileLoadCounts().sequenceLoads;
        cli::RunRecord record;
        record.cancelled = LibVerify::IsCancelled();
        record.checksPerformed = told.checksPerformed;
        for (const ResultPtr& result : LibVerify::GetResults())
            record.results.push_back({result, false});
        for (const ResultPtr& result : LibVerify::GetIgnoredResults())
            record.results.push_back({result, true});
        std::ostringstream json;
        cli::WriteJson(json, record);
        told.json = json.str();
        std::ostringstream text;
        cli::WriteText(text, record);
        told.text = text.str();
        const std::string reportFile = folder_.File("report.txt");
        ResultsReport::SaveResultsReport(reportFile);
        told.report = testsupport::ReadFileBytes(reportFile);
        fs::remove(reportFile);
        return told;
    }

    // Runs with one job and with several, and compares everything told.
    void ExpectSameWhateverTheJobs(int cancelAt = 0) {
        const Told serial = Run(1, cancelAt);
        if (cancelAt == 0) {
            ASSERT_GT(serial.sequenceLoads, 0);
        }
        for (const int jobs : {2, 4}) {
            SCOPED_TRACE("jobs " + std::to_string(jobs));
            const Told parallel = Run(jobs, cancelAt);
            EXPECT_EQ(parallel.notifications, serial.notifications);
            EXPECT_EQ(parallel.json, serial.json);
            EXPECT_EQ(parallel.text, serial.text);
            EXPECT_EQ(parallel.report, serial.report);
            EXPECT_EQ(parallel.checksPerformed, serial.checksPerformed);
            EXPECT_EQ(parallel.sequenceLoads, serial.sequenceLoads);
        }
    }

    // Options small enough for a test, with the shape's own changes made by `shape`.
    static gen::InstallationOptions Small(
        const std::function<void(gen::InstallationOptions&)>& shape) {
        gen::InstallationOptions options;
        options.shows = 4;
        options.sequencesPerShow = 4;
        options.channelsPerSequence = 24;
        options.eventsPerChannel = 6;
        shape(options);
        return options;
    }

    gen::Installation installation_;
    std::optional<testsupport::ScopedStore> store_;
};

TEST_F(ParallelLoading, EveryShapeOfInstallationIsToldTheSameWhateverTheJobs) {
    const std::vector<std::pair<std::string, std::function<void(gen::InstallationOptions&)>>>
        shapes = {
            {"plain", [](gen::InstallationOptions&) {}},
            {"faults", [](gen::InstallationOptions& o) { o.faults = true; }},
            {"compressed",
             [](gen::InstallationOptions& o) {
                 o.compressed = true;
                 o.faults = true;
             }},
            {"many channels",
             [](gen::InstallationOptions& o) {
                 o.channelsPerSequence = 600;
                 o.eventsPerChannel = 2;
                 o.tracksPerSequence = 3;
                 o.sharedTrackChannels = 5;
             }},
            {"data heavy",
             [](gen::InstallationOptions& o) {
                 o.shows = 2;
                 o.eventsPerChannel = 400;
             }},
            {"flat",
             [](gen::InstallationOptions& o) {
                 o.subsequences = false;
                 o.editFiles = false;
                 o.intensityFileDevices = -1;
                 o.backgroundChannels = 0;
                 o.calendarDays = 0;
             }},
            {"dense conflicts",
             [](gen::InstallationOptions& o) {
                 o.backgroundChannels = 24;
                 o.intensityFileDevices = 8;
                 o.calendarDays = 6;
             }},
        };
    for (const auto& [name, shape] : shapes) {
        SCOPED_TRACE(name);
        Generate(name, Small(shape));
        ExpectSameWhateverTheJobs();
    }
}

TEST_F(ParallelLoading, ACancelledRunStopsAtTheSamePlaceAndLeavesNoTemporaryFile) {
    Generate("cancelled", Small([](gen::InstallationOptions& o) {
                 o.faults = true;
                 o.shows = 6;
             }));
    // The first pumps come from the checks of the installation; a later one falls among the
    // sequences' loads.
    for (const int cancelAt : {3, 40, 200}) {
        SCOPED_TRACE("cancelled at pump " + std::to_string(cancelAt));
        ExpectSameWhateverTheJobs(cancelAt);
        EXPECT_THAT(Run(2, cancelAt).notifications, ::testing::Contains("Cancelled"));
    }
    EXPECT_TRUE(fs::is_empty(TempDir()) || !fs::exists(TempDir()));
}

TEST_F(ParallelLoading, AVerifiedShowOrSequenceIsToldTheSameWhateverTheJobs) {
    Generate("targets", Small([](gen::InstallationOptions& o) { o.faults = true; }));
    for (const std::string& file : {installation_.showFiles.front(), installation_.showFiles.back(),
                                    installation_.sequenceFiles.front()}) {
        SCOPED_TRACE(file);
        std::vector<std::vector<std::string>> logs;
        for (const int jobs : {1, 3}) {
            LibVerify::SetLoadingJobs(jobs);
            testsupport::RecordingClient client;
            if (file.find(".lss") != std::string::npos)
                LibVerify::VerifyShowFile(file);
            else
                LibVerify::VerifySequenceFile(file);
            LibVerify::RunVerification();
            // The wrapping files' names differ from run to run whatever the jobs.
            static const std::regex wrapping("VTRVer-(Show|WS|YS)-[^ /\\\\]*");
            std::vector<std::string> log;
            for (const std::string& line : client.log)
                log.push_back(std::regex_replace(line, wrapping, "VTRVer-$1-"));
            logs.push_back(log);
        }
        ASSERT_EQ(logs[0].size(), logs[1].size());
        EXPECT_EQ(logs[1], logs[0]);
    }
}

}  // namespace
}  // namespace vtr
