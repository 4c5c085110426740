#include "environment/LibRegistry.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "engine/VtrError.h"
#include "environment/LibRegistryVTR.h"
#include "environment/LibRegistryVTRShared.h"
#include "environment/RegistryStore.h"
#include "support/Raised.h"
#include "support/TempStore.h"

namespace vtr {
namespace {

using testsupport::RaisedDescription;
using namespace LibRegistry;
using ::testing::ElementsAre;
using ::testing::HasSubstr;

const char kHeader[] = "Windows Registry Editor Version 5.00\n\n";

// Passes every operation on to a store and writes down the ones that matter here.
class RecordingStore : public RegistryStore::Backend {
  public:
    explicit RecordingStore(std::unique_ptr<RegistryStore::Backend> inner)
        : inner_(std::move(inner)) {}

    std::optional<std::string> File() const override { return inner_->File(); }
    RegistryStore::Status OpenKey(KeyHandle parent, const std::string& subKey, uint32_t access,
                                  KeyHandle& result) override {
        const auto status = inner_->OpenKey(parent, subKey, access, result);
        if (status == 0)
            ++open;
        return status;
    }
    RegistryStore::Status CreateKey(KeyHandle parent, const std::string& subKey,
                                    KeyHandle& result) override {
        const auto status = inner_->CreateKey(parent, subKey, result);
        if (status == 0)
            ++open;
        return status;
    }
    RegistryStore::Status CloseKey(KeyHandle key) override {
        --open;
        return inner_->CloseKey(key);
    }
    RegistryStore::Status QueryValue(KeyHandle key, const std::string& name, uint32_t* type,
                                     uint8_t* data, uint32_t* size) override {
        return inner_->QueryValue(key, name, type, data, size);
    }
    RegistryStore::Status SetDwordValue(KeyHandle key, const std::string& name,
                                        uint32_t value) override {
        return inner_->SetDwordValue(key, name, value);
    }
    RegistryStore::Status SetStringValue(KeyHandle key, const std::string& name,
                                         const std::string& value) override {
        return inner_->SetStringValue(key, name, value);
    }
    RegistryStore::Status QuerySubkeyCount(KeyHandle key, uint32_t& count) override {
        return inner_->QuerySubkeyCount(key, count);
    }
    RegistryStore::Status EnumSubkey(KeyHandle key, uint32_t index, char* name,
                                     uint32_t* chars) override {
        calls.push_back("enum " + std::to_string(index));
        return inner_->EnumSubkey(key, index, name, chars);
    }
    RegistryStore::Status DeleteSubkey(KeyHandle key, const std::string& subKey) override {
        calls.push_back("delete " + subKey);
        return inner_->DeleteSubkey(key, subKey);
    }
    RegistryStore::Status BeginChanges() override { return inner_->BeginChanges(); }
    RegistryStore::Status CommitChanges() override { return inner_->CommitChanges(); }
    void AbortChanges() override { inner_->AbortChanges(); }
    Condition Examine() override { return inner_->Examine(); }
    std::string Failure() const override { return inner_->Failure(); }

    int open = 0;  // handles open now
    std::vector<std::string> calls;

  private:
    std::unique_ptr<RegistryStore::Backend> inner_;
};

class LibRegistryTest : public testsupport::StoreTest {};

TEST_F(LibRegistryTest, ReadersGiveTheirDefaultOnEveryFailure) {
    // No file at all.
    EXPECT_EQ(GetRegString(kCurrentUser, "Software\\Vantori\\Shared", "AppPath", "dflt"), "dflt");
    EXPECT_EQ(GetRegLong(kCurrentUser, "Software\\Vantori\\Shared", "PostInstallVer", 7), 7);
    EXPECT_TRUE(GetRegBool(kCurrentUser, "Software\\Vantori\\Shared", "UseCompressed", true));

    WriteStore(std::string(kHeader) +
               "[HKEY_CURRENT_USER\\Software\\Vantori\\Shared]\n"
               "\"Text\"=\"12\"\n"
               "\"Number\"=dword:ffffffff\n"
               "\"Blob\"=hex:01,00,00,00\n");
    const char* shared = "Software\\Vantori\\Shared";
    EXPECT_EQ(GetRegLong(kCurrentUser, shared, "Number", 0), -1);
    EXPECT_EQ(GetRegLong(kCurrentUser, shared, "Text", 3), 3);  // not a DWORD
    EXPECT_EQ(GetRegLong(kCurrentUser, shared, "Blob", 3), 3);
    EXPECT_EQ(GetRegLong(kCurrentUser, shared, "Missing", 3), 3);
    EXPECT_EQ(GetRegString(kCurrentUser, shared, "Blob", "d"), "d");
    EXPECT_EQ(GetRegString(kCurrentUser, "Software\\Nothing", "Text", "d"), "d");
    EXPECT_EQ(GetRegString(kCurrentUser, shared, "Text", "d"), "12");
}

TEST_F(LibRegistryTest, StringsOfStoredLengthZeroAndOneReadEmpty) {
    WriteStore(std::string(kHeader) +
               "[HKEY_CURRENT_USER\\K]\n"
               "\"Zero\"=hex(1):\n"
               "\"One\"=\"\"\n"
               "\"Two\"=\"x\"\n");
    EXPECT_EQ(GetRegString(kCurrentUser, "K", "Zero", "default"), "");
    EXPECT_EQ(GetRegString(kCurrentUser, "K", "One", "default"), "");
    EXPECT_EQ(GetRegString(kCurrentUser, "K", "Two", "default"), "x");
}

TEST_F(LibRegistryTest, BooleansAreDwordsAndAnyNonZeroIsTrue) {
    LibRegistryVTRShared::SetSharedBool("PostInstall", true, "");
    EXPECT_THAT(ReadStore(), HasSubstr("[HKEY_CURRENT_USER\\Software\\Vantori\\Shared]\n"
                                       "\"PostInstall\"=dword:00000001\n"));
    LibRegistryVTRShared::SetSharedLong("PostInstall", 5, "");
    EXPECT_TRUE(LibRegistryVTRShared::GetSharedBool("PostInstall", "", false));
    LibRegistryVTRShared::SetSharedBool("PostInstall", false, "");
    EXPECT_FALSE(LibRegistryVTRShared::GetSharedBool("PostInstall", "", true));
    EXPECT_EQ(LibRegistryVTRShared::GetSharedLong("PostInstall", "", 9), 0);
}

TEST_F(LibRegistryTest, SuiteAndSharedKeysArePathsBelowTheSuiteKey) {
    EXPECT_EQ(LibRegistryVTR::SuiteKeyPath(""), "Software\\Vantori");
    EXPECT_EQ(LibRegistryVTR::SuiteKeyPath("Verifier"), "Software\\Vantori\\Verifier");
    EXPECT_EQ(LibRegistryVTRShared::SharedKeyPath(""), "Shared");
    EXPECT_EQ(LibRegistryVTRShared::SharedKeyPath("NetVersion"), "Shared\\NetVersion");
    EXPECT_EQ(LibRegistryVTRShared::SharedKeyFullPath("NetVersion"),
              "Software\\Vantori\\Shared\\NetVersion");

    LibRegistryVTR::SetSuiteString("IgnoreMsg1", "23-a / ", "Verifier");
    LibRegistryVTR::SetSuiteLong("CountIgnoreMsg", 1, "Verifier");
    EXPECT_EQ(GetRegString(kCurrentUser, "Software\\Vantori\\Verifier", "IgnoreMsg1", ""),
              "23-a / ");
    EXPECT_EQ(LibRegistryVTR::GetSuiteLong("CountIgnoreMsg", "Verifier", 0), 1);
    LibRegistryVTRShared::SetSharedString("Ver", "{abc}", "NetVersion");
    EXPECT_EQ(LibRegistryVTRShared::GetSharedString("Ver", "NetVersion", ""), "{abc}");
    EXPECT_EQ(LibRegistryVTR::GetSuiteString("Ver", "Shared\\NetVersion", ""), "{abc}");
}

TEST_F(LibRegistryTest, WritingCreatesTheKeyButReadingNeverDoes) {
    EXPECT_EQ(LibRegistryVTR::GetSuiteString("X", "New\\Deeper", "d"), "d");
    EXPECT_FALSE(testsupport::ReadFileBytes(StoreFile()).size());  // still no file
    EXPECT_THAT(RaisedDescription(
                    [] { OpenRegistryKey(kCurrentUser, "Software\\Vantori\\New", kKeyRead); }),
                "RegOpenKeyEx failure");

    LibRegistryVTR::SetSuiteString("X", "v", "New\\Deeper");
    EXPECT_EQ(LibRegistryVTR::GetSuiteString("X", "New\\Deeper", "d"), "v");
    KeyHandle key = OpenRegistryKey(kCurrentUser, "Software\\Vantori\\New", kKeyRead);
    EXPECT_NE(key, 0u);
    CloseRegistryKey(key);
    EXPECT_EQ(key, 0u);
    CloseRegistryKey(key);  // a closed handle is left alone

    // Opening for writing creates a missing key; opening for anything else does not.
    KeyHandle written = OpenRegistryKey(kCurrentUser, "Software\\Made", kKeyWrite);
    CloseRegistryKey(written);
    EXPECT_THAT(ReadStore(), HasSubstr("[HKEY_CURRENT_USER\\Software\\Made]"));
    EXPECT_THAT(
        RaisedDescription([] { OpenRegistryKey(kCurrentUser, "Software\\Other", kKeyAllAccess); }),
        "RegOpenKeyEx failure");
}

TEST_F(LibRegistryTest, WritersAndDeletersRaiseTheirOwnFailureTexts) {
    // A store that is not a registry export at all is never overwritten.
    const std::string notes = "my own notes, not settings\n";
    WriteStore(notes);
    EXPECT_EQ(RaisedDescription([] { LibRegistryVTRShared::SetSharedString("AppPath", "x", ""); }),
              "RegSetValueEx failure");
    EXPECT_EQ(
        RaisedDescription([] { LibRegistryVTRShared::SetSharedLong("PostInstallVer", 1, ""); }),
        "RegSetValueEx failure");
    EXPECT_EQ(RaisedDescription([] { CreateRegistryKey(kCurrentUser, "Software\\Vantori"); }),
              "RegCreateKeyEx failure");
    EXPECT_EQ(RaisedDescription([] { DeleteRegistryKey(kCurrentUser, "Software", "Vantori"); }),
              "RegDeleteKey failure");
    EXPECT_EQ(RaisedDescription([] { DeleteRegistryKeyTree(kCurrentUser, "Software", "Vantori"); }),
              "RegDeleteKey failure");
    EXPECT_EQ(ReadStore(), notes);
    EXPECT_EQ(LibRegistryVTRShared::GetSharedString("AppPath", "", "d"), "d");

    // Deleting what is not there, or a key that still has subkeys.
    WriteStore(std::string(kHeader) + "[HKEY_CURRENT_USER\\Software\\Vantori\\Shared\\Sub]\n");
    EXPECT_EQ(
        RaisedDescription([] { DeleteRegistryKey(kCurrentUser, "Software\\Vantori", "Gone"); }),
        "RegDeleteKey failure");
    EXPECT_EQ(
        RaisedDescription([] { DeleteRegistryKey(kCurrentUser, "Software\\Vantori", "Shared"); }),
        "RegDeleteKey failure");
    EXPECT_EQ(
        RaisedDescription([] { DeleteRegistryKey(kCurrentUser, "Software\\Gone", "Shared"); }),
        "RegOpenKeyEx failure");
    EXPECT_EQ(RaisedDescription([] { DeleteRegistryKeyTree(kCurrentUser, "Software", "Gone"); }),
              "RegOpenKeyEx failure");
}

TEST_F(LibRegistryTest, KeysAreClosedOnFailureAndTheFirstErrorReachesTheCaller) {
    WriteStore("not a store\n");
    auto recording = std::make_unique<RecordingStore>(RegistryStore::OpenFileStore(StoreFile()));
    RecordingStore& store = *recording;
    testsupport::ScopedStore scoped(std::move(recording));
    try {
        SetRegString(kCurrentUser, "Software\\Vantori", "V", "x");
        FAIL() << "nothing raised";
    } catch (const VtrError& error) {
        EXPECT_EQ(error.Description(), "RegSetValueEx failure");
        EXPECT_EQ(error.Number(), kRegistryErrorNumber);
        EXPECT_EQ(error.Source(), "LibRegistry.SetRegString");
    }
    EXPECT_THROW(DeleteRegistryKey(kCurrentUser, "Software", "Vantori"), VtrError);
    EXPECT_EQ(GetRegLong(kCurrentUser, "Software", "V", 1), 1);
    EXPECT_EQ(store.open, 0);
}

TEST_F(LibRegistryTest, TreeDeletionTakesSubkeysAtIndexZeroDeepestFirst) {
    WriteStore(std::string(kHeader) +
               "[HKEY_CURRENT_USER\\Software\\Vantori\\Shared\\Network1]\n"
               "\"Comment\"=\"top\"\n"
               "[HKEY_CURRENT_USER\\Software\\Vantori\\Shared\\Network1\\AuxA]\n"
               "[HKEY_CURRENT_USER\\Software\\Vantori\\Shared\\Network1\\AuxA\\Deep]\n"
               "\"Comment\"=\"deepest\"\n"
               "[HKEY_CURRENT_USER\\Software\\Vantori\\Shared\\Network1\\AuxB]\n"
               "[HKEY_CURRENT_USER\\Software\\Vantori\\Shared\\Network2]\n"
               "\"Comment\"=\"kept\"\n");
    auto recording = std::make_unique<RecordingStore>(RegistryStore::OpenFileStore(StoreFile()));
    RecordingStore& store = *recording;
    testsupport::ScopedStore scoped(std::move(recording));

    DeleteRegistryKeyTree(kCurrentUser, LibRegistryVTRShared::SharedKeyFullPath(""), "Network1");
    EXPECT_THAT(store.calls, ElementsAre("enum 0", "enum 0", "delete Deep", "delete AuxA", "enum 0",
                                         "delete AuxB", "delete Network1"));
    EXPECT_EQ(store.open, 0);
    EXPECT_EQ(LibRegistryVTRShared::GetSharedString("Comment", "Network1\\AuxA\\Deep", "gone"),
              "gone");
    EXPECT_EQ(LibRegistryVTRShared::GetSharedString("Comment", "Network1", "gone"), "gone");
    EXPECT_EQ(LibRegistryVTRShared::GetSharedString("Comment", "Network2", "gone"), "kept");
    EXPECT_THAT(ReadStore(), ::testing::Not(HasSubstr("Network1")));
}

}  // namespace
}  // namespace vtr
