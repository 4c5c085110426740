#include "checks/installation/CheckAppPathExists.h"

#include <memory>

#include "checks/installation/CheckAppFileExists.h"
#include "checks/installation/CheckAppPathMatches.h"
#include "engine/CheckTypes.h"
#include "engine/LibVerify.h"
#include "engine/Messages.h"
#include "engine/VtrError.h"
#include "environment/LibFile.h"
#include "environment/VTRCommon.h"

namespace vtr {

const std::array<ApplicationFile, 28>& CheckAppPathExists::ApplicationFiles() {
    static constexpr std::array<ApplicationFile, 28> kFiles{{
        {"AudioEngineA.dll", "9.2.3.1"},     {"AudioDeckB.ocx", "6.1.1.0"},
        {"AudioEditC.ocx", "3.1.1.0"},       {"DigitalPortD.ocx", nullptr},
        {"UsbSerialE.dll", nullptr},         {"SerialCommF.ocx", nullptr},
        {"SuiteChannelIO.ocx", nullptr},     {"SuiteListener.exe", nullptr},
        {"SuiteCommon.dll", nullptr},        {"SuiteDiagnostic.exe", nullptr},
        {"SuiteManagedShared.dll", nullptr}, {"SuiteHardware.exe", nullptr},
        {"SuiteMonitor.exe", nullptr},       {"SuiteNetConfig.exe", nullptr},
        {"SuitePost.exe", nullptr},          {"SuiteScheduler.exe", nullptr},
        {"SuiteSequence.dll", nullptr},      {"SuiteSeqCompressor.exe", nullptr},
        {"SuiteSequencer.exe", nullptr},     {"SuiteShellCmd.dll", nullptr},
        {"SuiteShowPlayer.exe", nullptr},    {"SuiteTray.exe", nullptr},
        {"SuiteVerifier.exe", nullptr},      {"SuiteXyWrap.dll", nullptr},
        {"ServoUtility.exe", nullptr},       {"SimpleShowEdit.exe", nullptr},
        {"CommonControlsG.ocx", "1.1.0.25"}, {"XmlParserH.dll", "2.5.0.0"},
    }};
    return kFiles;
}

void CheckAppPathExists::Check() {
    const std::string appPath = ResumeOr(std::string{}, [] { return VTRCommon::GetAppPath(); });
    const bool exists = ResumeOr(false, [&] { return LibFile::DirectoryExists(appPath); });
    if (!exists) {
        LibVerify::AddResult(Messages::AppDirectoryMissing, {appPath});
        return;
    }
    LibVerify::AddCheck(std::make_shared<CheckAppPathMatches>());
    for (const ApplicationFile& file : ApplicationFiles()) {
        ResumeStep([&] {
            auto check = std::make_shared<CheckAppFileExists>();
            check->SetFilename(file.name);
            if (file.expectedVersion != nullptr)
                check->SetExpectedVersion(file.expectedVersion);
            LibVerify::AddCheck(check);
        });
    }
}

std::string CheckAppPathExists::CheckIdentifier() {
    return identifier_.Get(CheckType::AppPathExists, "");
}

}  // namespace vtr
