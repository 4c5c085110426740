#include "support/VerifierFixture.h"

#include <filesystem>

#include "checks/installation/CheckAppFileExists.h"
#include "checks/installation/CheckAppPathExists.h"
#include "engine/LibVerify.h"
#include "environment/RegistryFile.h"
#include "vtrsupport/PeImage.h"

namespace vtr::testsupport {

RecordingClient::RecordingClient() {
    LibVerify::AddNotificationClient(this);
}

RecordingClient::~RecordingClient() {
    LibVerify::RemoveNotificationClient(this);
}

void RecordingClient::Note(std::string line) {
    log.push_back(line);
    if (onLine)
        onLine(line);
}

void RecordingClient::CheckAdded(ICheck& check) {
    Note("Added " + check.Description());
}
void RecordingClient::CheckCompleted(ICheck& check) {
    Note("Completed " + check.Description());
}
void RecordingClient::Checking(ICheck& check) {
    Note("Checking " + check.Description());
}
void RecordingClient::ChecksCompleted(bool cancelled) {
    Note(std::string("ChecksCompleted ") + (cancelled ? "true" : "false"));
}
void RecordingClient::Initializing() {
    Note("Initializing");
}
void RecordingClient::ResultAdded(const ResultPtr& result) {
    Note("Result " + std::to_string(result->MessageNumber()) +
         (result->Ignorable() ? " ignored" : ""));
}
void RecordingClient::TransientMessage(const std::string& message) {
    Note("Transient " + message);
}
void RecordingClient::VerificationCancelled() {
    Note("Cancelled");
}

std::vector<std::string> RecordingClient::Lines(const std::string& prefix) const {
    std::vector<std::string> lines;
    for (const std::string& line : log) {
        if (line.rfind(prefix, 0) == 0)
            lines.push_back(line.substr(prefix.size()));
    }
    return lines;
}

ScriptedCheck::ScriptedCheck(std::string identifier, std::function<void()> body)
    : identifier_(std::move(identifier)), body_(std::move(body)) {}

void ScriptedCheck::Check() {
    ++runs;
    if (body_)
        body_();
}

std::shared_ptr<ScriptedCheck> MakeScripted(std::string identifier, std::function<void()> body) {
    return std::make_shared<ScriptedCheck>(std::move(identifier), std::move(body));
}

std::vector<std::string> ResultTexts() {
    std::vector<std::string> texts;
    for (const ResultPtr& result : LibVerify::GetResults()) {
        std::string text = std::to_string(result->MessageNumber()) + ":";
        const auto& details = result->Details();
        for (std::size_t i = 0; i < details.size(); ++i)
            text += (i == 0 ? " " : " | ") + details[i];
        texts.push_back(text);
    }
    return texts;
}

std::string RegText(const std::string& text) {
    return RegistryFile::QuotedText(text);
}

std::string RegDword(uint32_t value) {
    return RegistryFile::DwordText(value);
}

std::string StoreText(const StoreSections& sections) {
    std::string text = "Windows Registry Editor Version 5.00\r\n";
    for (const auto& [key, values] : sections) {
        text +=
            "\r\n[HKEY_CURRENT_USER\\Software\\Vantori" + (key.empty() ? "" : "\\" + key) + "]\r\n";
        for (const auto& [name, value] : values)
            text += RegText(name) + "=" + value + "\r\n";
    }
    return text;
}

SuiteTest::SuiteTest() {
    namespace fs = std::filesystem;
    fs::create_directories(AppFolder());
    fs::create_directories(DataFolder() + "nonmedia");
    fs::create_directories(DataFolder() + "media");
    store["Shared"] = {
        {"AppPath", RegText(AppFolder())},
        {"UserDataPath", RegText(DataFolder())},
        {"NonMediaDataPath", RegText(DataFolder() + "nonmedia")},
        {"MediaDataPath", RegText(DataFolder() + "media")},
        {"PostInstall", RegDword(1)},
        {"PostInstallVer", RegDword(53)},
    };
    store["Shared\\MediaPlayer"] = {{"VersionInfo", RegText("12.0.19041.1")}};
    WriteSuiteStore();
}

SuiteTest::~SuiteTest() = default;

void SuiteTest::WriteSuiteStore() {
    WriteStore(StoreText(store));
}

void SuiteTest::InstallApplicationFiles() {
    for (const ApplicationFile& file : CheckAppPathExists::ApplicationFiles()) {
        WritePeImage(AppFolder() + file.name, file.expectedVersion != nullptr
                                                  ? file.expectedVersion
                                                  : DefaultExpectedVersion());
    }
}

void SuiteTest::RunAlone(ICheck& check) {
    LibVerify::BeginVerification();
    client.Clear();
    check.Check();
}

}  // namespace vtr::testsupport
