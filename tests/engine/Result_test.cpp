#include "engine/Result.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <set>

#include "engine/CheckTypes.h"
#include "engine/CheckUtils.h"
#include "engine/LibVerify.h"
#include "engine/Messages.h"

namespace vtr {
namespace {

using ::testing::ElementsAre;
using ::testing::IsEmpty;

TEST(SeverityText, NamesTheThreeSeveritiesAndNumbersAnyOther) {
    EXPECT_EQ(SeverityText(Severity::Info), "Info");
    EXPECT_EQ(SeverityText(Severity::Warning), "Warning");
    EXPECT_EQ(SeverityText(Severity::Error), "Error");
    EXPECT_EQ(SeverityText(static_cast<Severity>(3)), "Severity 3");
    EXPECT_EQ(SeverityText(static_cast<Severity>(7)), "Severity 7");
    EXPECT_EQ(SeverityText(static_cast<Severity>(-1)), "Severity -1");

    Result result;
    result.SetSeverity(Severity::Warning);
    EXPECT_EQ(result.SeverityText(), "Warning");
}

TEST(Result, IgnoreKeyIsTheNumberThenEachDetailWithItsTrailingSeparator) {
    Result result;
    result.SetMessageNumber(23);
    result.AddDetail("A");
    result.AddDetail("B");
    EXPECT_EQ(result.IgnoreKey(), "23-A / B / ");
    EXPECT_THAT(result.Details(), ElementsAre("A", "B"));

    Result bare;
    bare.SetMessageNumber(20);
    EXPECT_EQ(bare.IgnoreKey(), "20-");
    EXPECT_THAT(bare.Details(), IsEmpty());

    // The key asked for once is kept, and follows a later detail or number.
    bare.AddDetail("C");
    EXPECT_EQ(bare.IgnoreKey(), "20-C / ");
    bare.SetMessageNumber(21);
    EXPECT_EQ(bare.IgnoreKey(), "21-C / ");
}

TEST(CheckUtils, IdentifierIsTheTypeThenTheParameterUnchanged) {
    using CheckUtils::MakeCheckIdentifier;
    EXPECT_EQ(MakeCheckIdentifier(0, ""), "0");
    EXPECT_EQ(MakeCheckIdentifier(2, ""), "2");
    EXPECT_EQ(MakeCheckIdentifier(17, "x.lss"), "17_x.lss");
    EXPECT_EQ(MakeCheckIdentifier(19, "C:\\Seq\\a.lms"), "19_C:\\Seq\\a.lms");
    // No folding or normalising: two writings of one path are two checks.
    EXPECT_NE(MakeCheckIdentifier(19, "C:\\Seq\\A.lms"), MakeCheckIdentifier(19, "C:\\Seq\\a.lms"));
    // The existence and the version check of one file are the same check.
    EXPECT_EQ(MakeCheckIdentifier(CheckType::AppFileExists, "VTR.exe"),
              MakeCheckIdentifier(CheckType::AppFileVersion, "VTR.exe"));

    CheckUtils::IdentifierOnce once;
    EXPECT_EQ(once.Get(CheckType::SequenceLoads, "a.lms"), "20_a.lms");
    EXPECT_EQ(once.Get(CheckType::SequenceLoads, "changed.lms"), "20_a.lms");
}

TEST(Messages, CatalogNumbersAreUniqueAndHelpIdsDifferOnlyFrom45On) {
    std::set<int32_t> numbers;
    for (const Message& message : Messages::kAll) {
        EXPECT_TRUE(numbers.insert(message.number).second) << message.number;
        if (message.number <= 44) {
            EXPECT_EQ(message.helpContextId, message.number);
        }
        EXPECT_NE(std::string(message.summary), "");
    }
    EXPECT_EQ(numbers.size(), 45u);
    EXPECT_EQ(Messages::SequenceIntensityFileSettingsConflict.helpContextId, 47);
    EXPECT_EQ(Messages::IntensityFileUndefinedNetwork.helpContextId, 51);
    EXPECT_EQ(Messages::CompressedSequencesDisabled.number, 51);
    EXPECT_EQ(Messages::CompressedSequencesDisabled.helpContextId, 54);
    EXPECT_EQ(Messages::TriggerUsesEnhancedNetwork.helpContextId, 57);
    EXPECT_STREQ(Messages::NoErrorsOrWarnings.summary, "No errors or warnings found");
    EXPECT_EQ(Messages::NoErrorsOrWarnings.severity, Severity::Info);
    EXPECT_STREQ(Messages::SequenceChannelSettingsConflict.summary,
                 "Conflicting channel settings in sequence");
}

}  // namespace
}  // namespace vtr
