#include "environment/MediaPlayerProbe.h"

#include <gtest/gtest.h>

#include "engine/VtrError.h"
#include "support/VerifierFixture.h"

namespace vtr {
namespace {

using MediaPlayerProbe::IsVersionTextAtLeast;

TEST(MediaPlayerProbe, TheMajorVersionMustBeCanonicalAndHigh) {
    EXPECT_TRUE(IsVersionTextAtLeast("12.0.19041.1", 9));
    EXPECT_TRUE(IsVersionTextAtLeast("9.0.0.4503", 9));
    EXPECT_FALSE(IsVersionTextAtLeast("8.0.0.1", 9));
    EXPECT_FALSE(IsVersionTextAtLeast("12.0", 9));            // two parts
    EXPECT_FALSE(IsVersionTextAtLeast("12.0.19041.1.2", 9));  // five
    EXPECT_FALSE(IsVersionTextAtLeast("", 9));
    EXPECT_FALSE(IsVersionTextAtLeast("09.0.0.1", 9));  // not written canonically
    EXPECT_FALSE(IsVersionTextAtLeast(" 9.0.0.1", 9));
    EXPECT_FALSE(IsVersionTextAtLeast("+9.0.0.1", 9));
    EXPECT_FALSE(IsVersionTextAtLeast("9x.0.0.1", 9));
    EXPECT_FALSE(IsVersionTextAtLeast("99999999999.0.0.1", 9));  // beyond a 32-bit number
    EXPECT_FALSE(IsVersionTextAtLeast("-12.0.0.1", 9));
    // The other parts are not looked at.
    EXPECT_TRUE(IsVersionTextAtLeast("10.x..", 9));
}

TEST(MediaPlayerProbe, AMinimumOfZeroOrLessIsAlwaysMet) {
    EXPECT_TRUE(IsVersionTextAtLeast("", 0));
    EXPECT_TRUE(IsVersionTextAtLeast("garbage", -3));
}

TEST(MediaPlayerProbe, AnInstalledSourceAnswersUntilItGoesAndAFailingOneMeetsNoMinimum) {
    using MediaPlayerProbe::IsVersionAtLeast;
    using MediaPlayerProbe::ScopedVersionSource;
    using MediaPlayerProbe::VersionText;
    // An outer source stands for the built-in probe, which would ask the machine's player.
    ScopedVersionSource outer([] { return std::string("12.0.0.0"); });
    {
        ScopedVersionSource installed([] { return std::string("10.0.0.1"); });
        EXPECT_EQ(VersionText(), "10.0.0.1");
        EXPECT_TRUE(IsVersionAtLeast(10));
        EXPECT_FALSE(IsVersionAtLeast(11));
        {
            ScopedVersionSource failing(
                []() -> std::string { Raise(ErrorNumbers::ObjectNotSet, "test", "no control"); });
            EXPECT_THROW(VersionText(), VtrError);
            EXPECT_FALSE(IsVersionAtLeast(9));
            EXPECT_FALSE(IsVersionAtLeast(0));  // a probe that fails meets no minimum at all
        }
        EXPECT_EQ(VersionText(), "10.0.0.1");
    }
    EXPECT_EQ(VersionText(), "12.0.0.0");
}

#ifndef _WIN32
class MediaPlayerStoreTest : public testsupport::StoreTest {};

TEST_F(MediaPlayerStoreTest, AwayFromWindowsTheVersionComesFromTheStore) {
    EXPECT_EQ(MediaPlayerProbe::VersionText(), "");
    EXPECT_FALSE(MediaPlayerProbe::IsVersionAtLeast(9));
    EXPECT_TRUE(MediaPlayerProbe::IsVersionAtLeast(0));

    WriteStore(testsupport::StoreText(
        {{"Shared\\MediaPlayer", {{"VersionInfo", testsupport::RegText("11.0.6002.18111")}}}}));
    EXPECT_EQ(MediaPlayerProbe::VersionText(), "11.0.6002.18111");
    EXPECT_TRUE(MediaPlayerProbe::IsVersionAtLeast(9));
    EXPECT_FALSE(MediaPlayerProbe::IsVersionAtLeast(12));

    // Once an installed source goes, the store answers again.
    {
        MediaPlayerProbe::ScopedVersionSource installed([] { return std::string("9.0.0.1"); });
        EXPECT_EQ(MediaPlayerProbe::VersionText(), "9.0.0.1");
    }
    EXPECT_EQ(MediaPlayerProbe::VersionText(), "11.0.6002.18111");
}
#endif

}  // namespace
}  // namespace vtr
