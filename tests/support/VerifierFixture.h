#pragma once

#include <functional>
#include <map>
#include <memory>
#include <string>
#include <vector>

#include "engine/ICheck.h"
#include "engine/INotificationClient.h"
#include "support/TempStore.h"

// Test support for the verification driver and the checks: a notification client that
// writes down what it is told, a check whose body the test gives, settings-store text for
// a suite installation, and a fixture that runs single checks as the driver would.
namespace vtr::testsupport {

// Writes every notification down as one line:
//   "Initializing", "Added <description>", "Checking <description>",
//   "Completed <description>", "Result <number>" (+ " ignored"), "Transient <text>",
//   "Cancelled", "ChecksCompleted <true|false>".
// A test may act on a line as it is written (cancel, start a run, throw).
class RecordingClient : public INotificationClient {
  public:
    RecordingClient();            // registers itself with the driver
    ~RecordingClient() override;  // and unregisters
    RecordingClient(const RecordingClient&) = delete;
    RecordingClient& operator=(const RecordingClient&) = delete;

    void CheckAdded(ICheck& check) override;
    void CheckCompleted(ICheck& check) override;
    void Checking(ICheck& check) override;
    void ChecksCompleted(bool cancelled) override;
    void Initializing() override;
    void ResultAdded(const ResultPtr& result) override;
    void TransientMessage(const std::string& message) override;
    void VerificationCancelled() override;

    std::vector<std::string> log;
    std::function<void(const std::string& line)> onLine;

    // The lines that begin with the prefix, with the prefix cut off.
    std::vector<std::string> Lines(const std::string& prefix) const;
    void Clear() { log.clear(); }

  private:
    void Note(std::string line);
};

// A check with a fixed identifier and description whose body the test gives.
class ScriptedCheck : public ICheck {
  public:
    ScriptedCheck(std::string identifier, std::function<void()> body = {});
    void Check() override;
    std::string CheckIdentifier() override { return identifier_; }
    std::string Description() override { return identifier_; }
    int runs = 0;

  private:
    std::string identifier_;
    std::function<void()> body_;
};

std::shared_ptr<ScriptedCheck> MakeScripted(std::string identifier,
                                            std::function<void()> body = {});

// The results of the current run (not ignored) as "number: detail | detail".
std::vector<std::string> ResultTexts();

// Settings-store text: sections below HKEY_CURRENT_USER\Software\Vantori, each a map of
// value name to its text as the store holds it ("\"text\"" or "dword:00000001"). Use
// RegText and RegDword for the values.
using StoreSections = std::map<std::string, std::map<std::string, std::string>>;
std::string StoreText(const StoreSections& sections);
std::string RegText(const std::string& text);
std::string RegDword(uint32_t value);

// A suite installed in the test's folder: "app" and "data" folders (with the non-media and
// media folders inside "data"), the store naming them, the post-install step done, the
// media player at version 12.0.19041.1, and nothing in the application folder.
class SuiteTest : public StoreTest {
  protected:
    SuiteTest();
    ~SuiteTest() override;

    std::string AppFolder() const { return folder_.File("app") + kSep; }
    std::string DataFolder() const { return folder_.File("data") + kSep; }
    std::string DataFile(const std::string& name) const { return DataFolder() + name; }
    // A file in the media folder, named as the suite's folders join names on this platform.
    std::string MediaFile(const std::string& name) const {
        return DataFolder() + "media" + kSep + name;
    }

    // The store's sections for this suite; a test changes them and calls WriteSuiteStore.
    StoreSections store;
    void WriteSuiteStore();

    // Puts every listed application file into the application folder with its expected
    // version.
    void InstallApplicationFiles();

    // BeginVerification (as the window does at start), then the check's body run on its
    // own; the checks it queued and the results it added are in the client's log.
    void RunAlone(ICheck& check);

    RecordingClient client;

#ifdef _WIN32
    static constexpr char kSep = '\\';
#else
    static constexpr char kSep = '/';
#endif
};

}  // namespace vtr::testsupport
