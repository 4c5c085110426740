// The file-version reader: our own reader of PE images on every platform, and
// FileVersionText (the system's service on Windows) on the images the tests write.
#include "environment/FileVersion.h"

#include <gtest/gtest.h>

#include <filesystem>
#include <random>

#include "support/TempStore.h"
#include "vtrsupport/PeImage.h"

#ifndef _WIN32
#include <sys/stat.h>
#endif

namespace vtr {
namespace {

namespace fs = std::filesystem;
using testsupport::PeImageBytes;
using testsupport::PeImageLayout;
using testsupport::PeImageOptions;

class FileVersionTest : public ::testing::Test {
  protected:
    // The version our reader finds in these bytes, as text ("" for none), read from memory
    // and from a file alike.
    std::string Read(const std::string& bytes) {
        const auto inMemory = ReadPeVersion(bytes);
        const std::string path = folder_.File("image.dll");
        testsupport::WriteFileBytes(path, bytes);
        const auto fromFile = ReadPeFileVersion(path);
        const std::string text = inMemory ? FileVersionToText(*inMemory) : "";
        EXPECT_EQ(fromFile ? FileVersionToText(*fromFile) : "", text);
        return text;
    }
    // Only in memory, for the many images of the damage tests.
    static std::string ReadBytes(const std::string& bytes) {
        const auto version = ReadPeVersion(bytes);
        return version ? FileVersionToText(*version) : "";
    }

    static void Put32(std::string& bytes, std::size_t at, uint32_t value) {
        for (int i = 0; i < 4; ++i)
            bytes[at + i] = static_cast<char>(value >> (8 * i));
    }
    static void Put16(std::string& bytes, std::size_t at, uint16_t value) {
        bytes[at] = static_cast<char>(value);
        bytes[at + 1] = static_cast<char>(value >> 8);
    }

    testsupport::TempFolder folder_;
};

TEST_F(FileVersionTest, ReadsTheFixedVersionOfWellFormedImages) {
    EXPECT_EQ(Read(PeImageBytes("9.2.3.1")), "9.2.3.1");
    EXPECT_EQ(Read(PeImageBytes("65535.0.65535.65534")), "65535.0.65535.65534");
    EXPECT_EQ(Read(PeImageBytes("0.0.0.0")), "0.0.0.0");

    PeImageOptions wide;
    wide.version = "1.1.0.25";
    wide.pe32Plus = true;
    EXPECT_EQ(Read(PeImageBytes(wide)), "1.1.0.25");

    PeImageOptions twoSections;
    twoSections.version = "6.1.1.0";
    twoSections.codeSectionFirst = true;
    EXPECT_EQ(Read(PeImageBytes(twoSections)), "6.1.1.0");
    twoSections.pe32Plus = true;
    EXPECT_EQ(Read(PeImageBytes(twoSections)), "6.1.1.0");
}

TEST_F(FileVersionTest, FileVersionTextGivesTheSameAnswers) {
    const std::string path = folder_.File("SuiteCommon.dll");
    testsupport::WritePeImage(path, "1.0.0.7");
    EXPECT_EQ(FileVersionText(path), "1.0.0.7");
    testsupport::WritePeImage(path);
    EXPECT_EQ(FileVersionText(path), "");
    EXPECT_EQ(FileVersionText(folder_.File("missing.dll")), "");
    EXPECT_EQ(FileVersionText(folder_.Path()), "");
}

TEST_F(FileVersionTest, AnythingElseHasNoVersion) {
    EXPECT_EQ(Read(PeImageBytes("")), "");  // resources, but no version among them
    EXPECT_EQ(Read(""), "");
    EXPECT_EQ(Read("MZ"), "");
    EXPECT_EQ(Read("plain text, not an executable at all\n"), "");
    EXPECT_FALSE(ReadPeFileVersion(folder_.File("missing.dll")));
    EXPECT_FALSE(ReadPeFileVersion(folder_.Path()));

    PeImageOptions badSignature;
    badSignature.version = "1.2.3.4";
    badSignature.fixedInfoSignature = 0xFEEF04BC;
    EXPECT_EQ(Read(PeImageBytes(badSignature)), "");
}

TEST_F(FileVersionTest, DamagedHeadersGiveNoVersion) {
    PeImageLayout at;
    PeImageOptions options;
    options.version = "1.2.3.4";
    const std::string good = PeImageBytes(options, &at);
    ASSERT_EQ(Read(good), "1.2.3.4");

    auto damaged = [&](auto change) {
        std::string bytes = good;
        change(bytes);
        return Read(bytes);
    };
    // The PE header beyond the end of the file, or not there.
    EXPECT_EQ(damaged([&](std::string& b) { Put32(b, 0x3C, 0xFFFFFFF0u); }), "");
    EXPECT_EQ(damaged([&](std::string& b) { b[at.peHeader + 1] = 'X'; }), "");
    // An optional header of an unknown kind, or too short to hold the resource entry.
    EXPECT_EQ(damaged([&](std::string& b) { Put16(b, at.optionalHeader, 0x107); }), "");
    EXPECT_EQ(damaged([&](std::string& b) { Put16(b, at.peHeader + 20, 96); }), "");
    // Every section the header could claim: a bounded read that runs past the end.
    EXPECT_EQ(damaged([&](std::string& b) { Put16(b, at.peHeader + 6, 0xFFFF); }), "");
    EXPECT_EQ(damaged([&](std::string& b) { Put16(b, at.peHeader + 6, 0); }), "");
    // Resources at an address no section holds, or none at all.
    EXPECT_EQ(damaged([&](std::string& b) { Put32(b, at.resourceDirectoryEntry, 0x7FFFF000u); }),
              "");
    EXPECT_EQ(damaged([&](std::string& b) { Put32(b, at.resourceDirectoryEntry + 4, 0); }), "");
    // A resource directory claiming 131070 entries.
    EXPECT_EQ(damaged([&](std::string& b) {
                  Put16(b, at.resourceSection + 12, 0xFFFF);
                  Put16(b, at.resourceSection + 14, 0xFFFF);
              }),
              "");
    // The version entry pointing back at the root: no endless descent.
    EXPECT_EQ(damaged([&](std::string& b) { Put32(b, at.resourceSection + 20, 0x80000000u); }), "");
    // A data entry whose data lies beyond the file, or is too small for the fixed block.
    EXPECT_EQ(damaged([&](std::string& b) { Put32(b, at.dataEntry, 0xFFFFFFF0u); }), "");
    EXPECT_EQ(damaged([&](std::string& b) { Put32(b, at.dataEntry + 4, 40); }), "");
    // A version resource that is not VS_VERSION_INFO, or whose value is too short.
    EXPECT_EQ(damaged([&](std::string& b) { b[at.versionInfo + 6] = 'W'; }), "");
    EXPECT_EQ(damaged([&](std::string& b) { Put16(b, at.versionInfo + 2, 51); }), "");
}

TEST_F(FileVersionTest, TruncatedImagesNeverReadBeyondTheirEnd) {
    const std::string good = PeImageBytes("3.1.1.0");
    for (std::size_t length = 0; length < good.size(); ++length) {
        const std::string found = ReadBytes(good.substr(0, length));
        // Cutting the padding after the data leaves the version readable; nothing else does.
        EXPECT_TRUE(found.empty() || found == "3.1.1.0") << length;
    }
}

TEST_F(FileVersionTest, RandomDamageNeverCrashes) {
    PeImageLayout at;
    PeImageOptions options;
    options.version = "2.5.0.0";
    options.codeSectionFirst = true;
    const std::string good = PeImageBytes(options, &at);
    std::mt19937 random(20240521u);  // fixed: the same damage on every run
    std::uniform_int_distribution<std::size_t> where(0, at.versionInfo + 96);
    std::uniform_int_distribution<int> byte(0, 255);
    std::uniform_int_distribution<int> count(1, 8);
    int stillRead = 0;
    for (int round = 0; round < 20000; ++round) {
        std::string bytes = good;
        for (int n = count(random); n > 0; --n)
            bytes[where(random)] = static_cast<char>(byte(random));
        const std::string found = ReadBytes(bytes);
        // Either nothing or four numbers.
        if (!found.empty()) {
            ++stillRead;
            EXPECT_EQ(std::count(found.begin(), found.end(), '.'), 3) << found;
        }
    }
    EXPECT_GT(stillRead, 0);  // damage to unused bytes leaves the version readable
}

TEST_F(FileVersionTest, AHugeFileCostsNoMoreThanASmallOne) {
    // A sparse file of 6 GiB: the reader reads its few pieces and never the rest.
    const std::string path = folder_.File("huge.dll");
    testsupport::WriteFileBytes(path, PeImageBytes("9.2.3.1"));
    std::error_code error;
    fs::resize_file(path, std::uintmax_t{6} << 30, error);
    if (error)
        GTEST_SKIP() << "no room for a sparse file: " << error.message();
    EXPECT_EQ(FileVersionText(path), "9.2.3.1");

    // Its headers pointing far into the empty part: read, found empty, given up.
    std::string bytes = PeImageBytes("9.2.3.1");
    Put32(bytes, 0x3C, 0xFFFFFF00u);
    testsupport::WriteFileBytes(path, bytes);
    fs::resize_file(path, std::uintmax_t{6} << 30, error);
    ASSERT_FALSE(error);
    EXPECT_EQ(FileVersionText(path), "");
    fs::remove(path);
}

#ifndef _WIN32
TEST_F(FileVersionTest, APipeIsNotOpened) {
    // Opening a pipe for reading would wait for a writer; it is refused before that.
    const std::string path = folder_.File("pipe.dll");
    ASSERT_EQ(::mkfifo(path.c_str(), 0600), 0);
    EXPECT_EQ(FileVersionText(path), "");
}
#endif

TEST(PeImageWriter, RefusesVersionsThatAreNotFourNumbers) {
    for (const char* bad : {"1.2.3", "1.2.3.4.5", "1..3.4", "a.b.c.d", "65536.0.0.0", "1.2.3.-4"})
        EXPECT_THROW(PeImageBytes(bad), std::invalid_argument) << bad;
    testsupport::TempFolder folder;
    EXPECT_THROW(testsupport::WritePeImage(folder.File("missing/x.dll"), "1.0.0.0"),
                 std::runtime_error);
}

}  // namespace
}  // namespace vtr
