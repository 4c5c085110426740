#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "SeqTestFiles.h"
#include "sequencelib/Sequence.h"
#include "sequencelib/XmlPieceReader.h"

namespace vtr::seqlib {
namespace {

using testing::ErrorOf;
using testing::Gzip;
using ::testing::HasSubstr;
using ::testing::StartsWith;
using testing::TempFolder;

struct BadText {
    const char* what;
    std::string text;
    const char* message;  // after the file's name
    // When the document is read in pieces of 16 bytes, if that differs.
    const char* smallPieceMessage = nullptr;
};

// Every failure carries the file, the place and the cause, whether the document is
// parsed as one piece or in pieces of a few bytes.
TEST(SequenceLoadErrors, NameTheFileThePlaceAndTheCause) {
    const std::vector<BadText> cases = {
        {"empty file", "", "line 1, column 1: the document has no root element"},
        {"only blanks", "  \n  ", "line 2, column 3: the document has no root element"},
        {"root of another kind", "<?xml version=\"1.0\"?>\n<show/>",
         "line 2, column 1: the root element is <show>, not <sequence>"},
        {"channel without id",
         "<sequence>\n<channels>\n  <channel name=\"x\"/>\n</channels></sequence>",
         "line 3, column 3: the <channel> has no id"},
        {"channel with an empty id", "<sequence><channels><channel id=\"\"/></channels></sequence>",
         "line 1, column 21: the <channel> has no id"},
        {"repeated channel id",
         "<sequence><channels>\n<channel id=\"1\"/>\n<channel name=\"b\" "
         "id=\"1\"/></channels></sequence>",
         "line 3, column 19: the channel id \"1\" is repeated"},
        {"reference to no channel",
         "<sequence><channels><channel id=\"1\"/></channels><tracks><track>\n  <channelRef "
         "id=\"7\"/></track></tracks></sequence>",
         "line 2, column 3: the <channelRef> names no channel (id \"7\")"},
        {"reference without id",
         "<sequence><tracks><track><channelRef/></track></tracks></sequence>",
         "line 1, column 26: the <channelRef> names no channel (id \"\")"},
        {"unit out of range",
         "<sequence><channels><channel id=\"1\" unit=\"256\"/></channels></sequence>",
         "line 1, column 37: the attribute unit=\"256\" of <channel> is not a whole number from 0 "
         "to 255"},
        {"fraction",
         "<sequence><channels><channel id=\"1\" circuit=\"1.5\"/></channels></sequence>",
         "line 1, column 37: the attribute circuit=\"1.5\" of <channel> is not a whole number from "
         "0 to 32767"},
        {"circuit beyond 16 bits",
         "<sequence><channels><channel id=\"1\" circuits=\"32768\"/></channels></sequence>",
         "line 1, column 37: the attribute circuits=\"32768\" of <channel> is not a whole number "
         "from 0 to 32767"},
        {"negative length", "<sequence length=\"-1\"/>",
         "line 1, column 11: the attribute length=\"-1\" of <sequence> is not a whole number from "
         "0 to 2147483647"},
        {"plus sign", "<sequence length=\"+1\"/>",
         "line 1, column 11: the attribute length=\"+1\" of <sequence> is not a whole number from "
         "0 to 2147483647"},
        {"letters",
         "<sequence><channels><channel id=\"1\"><event "
         "intensity=\"abc\"/></channel></channels></sequence>",
         "line 1, column 44: the attribute intensity=\"abc\" of <event> is not a whole number from "
         "0 to 100"},
        {"empty number",
         "<sequence><channels><channel id=\"1\"><event "
         "start=\"\"/></channel></channels></sequence>",
         "line 1, column 44: the attribute start=\"\" of <event> is not a whole number from "
         "-2147483648 to 2147483647"},
        {"huge number",
         "<sequence><channels><channel id=\"1\"><event "
         "end=\"99999999999999999999\"/></channel></channels></sequence>",
         "line 1, column 44: the attribute end=\"99999999999999999999\" of <event> is not a whole "
         "number from -2147483648 to 2147483647"},
        {"device count",
         "<sequence><tracks><track><intensityFile kind=\"Gridcraft\"><device "
         "count=\"-2\"/></intensityFile></track></tracks></sequence>",
         "line 1, column 66: the attribute count=\"-2\" of <device> is not a whole number from 0 "
         "to 32767"},
        {"second file of a kind",
         "<sequence><tracks><track><intensityFile kind=\"Novalux\"/></track><track>\n "
         "<intensityFile kind=\"Novalux\"/></track></tracks></sequence>",
         "line 2, column 2: a second Novalux intensity file (a sequence has at most one of each "
         "kind)"},
        {"repeated attribute", "<sequence length=\"1\" length=\"2\"/>",
         "line 1, column 22: the attribute length of <sequence> is repeated"},
        {"text before the root", "hello<sequence/>",
         "line 1, column 1: text before the root element"},
        {"second root", "<sequence/>\n<sequence/>",
         "line 2, column 1: content after the end of the root element"},
        {"text after the root", "<sequence/>x", "line 1, column 12: text after the root element"},
        {"DOCTYPE inside", "<sequence><!DOCTYPE x></sequence>",
         "line 1, column 21: a DOCTYPE is allowed only before the root element"},
        {"declaration inside", "<sequence>\n  <?xml version=\"1.0\"?></sequence>",
         "line 2, column 5: an XML declaration is allowed only at the start of the document"},
        {"declaration late", "<!-- c --><?xml version=\"1.0\"?><sequence/>",
         "line 1, column 11: the XML declaration is not at the start of the document"},
        {"NUL byte", std::string("<sequence><a>\0</a></sequence>", 30),
         "line 1, column 14: a NUL character in the text"},
        {"UTF-16", std::string("\xff\xfe<\0s\0", 6),
         "line 1, column 1: the text is UTF-16; a sequence file is UTF-8"},
        {"unquoted attribute", "<sequence><channels><channel id=1/></channels></sequence>",
         "line 1, column 33: the XML is not well-formed (error parsing element attribute)"},
        {"wrong end tag", "<sequence><channels></channel></sequence>",
         "line 1, column 23: the XML is not well-formed (start-end tags mismatch)",
         "line 1, column 21: the end tag </channel> does not match <channels> opened at line 1, "
         "column 11"},
        {"data ends in a tag", "<sequence><channels><channel id=\"1",
         "line 1, column 34: the XML is not well-formed (error parsing element attribute)"},
        {"data ends in the root tag", "<sequ",
         "line 1, column 1: the data ends inside this markup"},
        {"end tag first", "</x><sequence/>",
         "line 1, column 1: an end tag before the root element"},
        {"data ends early", "<sequence>\n<channels>\n",
         "line 2, column 11: the XML is not well-formed (start-end tags mismatch)",
         "line 3, column 1: the data ends before the end tag of <channels> (opened at line 2, "
         "column 1)"},
    };
    TempFolder folder;
    for (const BadText& bad : cases) {
        const std::string path = folder.Write("bad.lms", bad.text);
        for (const std::size_t piece : {std::size_t{1} << 20, std::size_t{16}}) {
            LoadOptions options;
            options.pieceBytes = piece;
            Sequence s;
            EXPECT_EQ(
                ErrorOf([&] { s.Load(path, {}, options); }),
                "Cannot load sequence file \"" + path + "\": " +
                    (piece == 16 && bad.smallPieceMessage ? bad.smallPieceMessage : bad.message))
                << bad.what << ", pieces of " << piece;
        }
    }
}

TEST(SequenceLoadErrors, AreRaisedAsUserMessagesOfTheLoad) {
    TempFolder folder;
    try {
        Sequence().Load(folder.File("missing.lms"));
        FAIL() << "no error";
    } catch (const VtrError& e) {
        EXPECT_EQ(e.Number(), ErrorNumbers::UserMessage);
        EXPECT_EQ(e.Source(), "Sequence.Load");
        EXPECT_THAT(e.Description(),
                    StartsWith("Cannot load sequence file \"" + folder.File("missing.lms") +
                               "\": the file cannot be read ("));
    }
    EXPECT_THAT(ErrorOf([&] { Sequence().Load(folder.Path().string()); }),
                HasSubstr("\": the file cannot be read ("));
}

TEST(SequenceLoadErrors, AnElementLeftOpenOrClosedWronglyAcrossPieces) {
    TempFolder folder;
    LoadOptions small;
    small.pieceBytes = 16;
    const std::string wrongEnd = folder.Write(
        "a.lms", "<sequence>\n  <channels>\n    <channel id=\"1\"/>\n  </tracks>\n</sequence>");
    EXPECT_EQ(ErrorOf([&] { Sequence().Load(wrongEnd, {}, small); }),
              "Cannot load sequence file \"" + wrongEnd +
                  "\": line 4, column 3: the end tag </tracks> does not match <channels> opened at "
                  "line 2, column 3");
    const std::string open = folder.Write(
        "b.lms", "<sequence>\n  <channels>\n    <channel id=\"1\"/>\n    <channel id=\"2\"/>\n");
    EXPECT_EQ(ErrorOf([&] { Sequence().Load(open, {}, small); }),
              "Cannot load sequence file \"" + open +
                  "\": line 5, column 1: the data ends before the end tag of <channels> (opened at "
                  "line 2, column 3)");
    const std::string junk = folder.Write(
        "c.lms", "<sequence>\n<channels>\n<channel id=\"1\"/>\n</channels junk></sequence>");
    EXPECT_EQ(ErrorOf([&] { Sequence().Load(junk, {}, small); }),
              "Cannot load sequence file \"" + junk +
                  "\": line 4, column 1: the end tag </channels> is malformed");
}

TEST(SequenceLoadErrors, PlacesCountLinesAcrossManyPieces) {
    TempFolder folder;
    std::string text = "<sequence length=\"5\">\n<channels>\n";
    for (int i = 1; i <= 2000; ++i) {
        text += "<channel id=\"" + std::to_string(i) +
                "\"><event end=\"3\" intensity=\"1\"/></channel>\n";
    }
    text += "<channel id=\"x\" unit=\"-1\"/>\n</channels></sequence>\n";
    const std::string path = folder.Write("many.lms", text);
    for (const std::size_t piece : {std::size_t{64}, std::size_t{4096}, std::size_t{1} << 20}) {
        LoadOptions options;
        options.pieceBytes = piece;
        EXPECT_EQ(ErrorOf([&] { Sequence().Load(path, {}, options); }),
                  "Cannot load sequence file \"" + path +
                      "\": line 2003, column 17: the attribute unit=\"-1\" of <channel> is not a "
                      "whole number from 0 to 255")
            << piece;
    }
}

TEST(SequenceLoadErrors, BadGzipDataIsPlacedInTheCompressedBytes) {
    TempFolder folder;
    const std::string xml =
        "<sequence length=\"10\"><channels><channel id=\"1\"/></channels></sequence>";
    const std::string gz = Gzip(xml);
    const auto load = [&](const std::string& bytes, LoadOptions options = {}) {
        const std::string path = folder.Write("g.las", bytes);
        const std::string error = ErrorOf([&] { Sequence().Load(path, {}, options); });
        const std::string prefix = "Cannot load sequence file \"" + path + "\": ";
        return error.rfind(prefix, 0) == 0 ? error.substr(prefix.size()) : error;
    };
    std::string corrupt = gz;
    corrupt[12] = static_cast<char>(corrupt[12] ^ 0x55);
#ifdef _WIN32
    // GoogleTest's regular expressions on Windows know \d but no bracket expressions.
    const char* const digits = "\\d+";
#else
    const char* const digits = "[0-9]+";
#endif
    EXPECT_THAT(load(corrupt),
                ::testing::MatchesRegex(std::string("byte ") + digits +
                                        " of the compressed data: the data is not valid gzip "
                                        "data \\(.+\\)"));
    EXPECT_EQ(load(gz.substr(0, gz.size() - 10)),
              "byte " + std::to_string(gz.size() - 10) +
                  " of the compressed data: the gzip data ends early (the file is truncated)");
    std::string badCheck = gz;
    badCheck[gz.size() - 6] = static_cast<char>(badCheck[gz.size() - 6] ^ 1);
    EXPECT_THAT(load(badCheck),
                HasSubstr("the data is not valid gzip data (incorrect data check)"));
    EXPECT_EQ(load(gz + "xyz"), "byte " + std::to_string(gz.size()) +
                                    " of the compressed data: unexpected data after the end of the "
                                    "gzip data");
    EXPECT_EQ(load(std::string("\x1f\x8b\x09\x00", 4) + "garbage"),
              "byte 4 of the compressed data: the data is not valid gzip data (unknown compression "
              "method)");
}

TEST(SequenceLoadErrors, ACompressedFileThatExpandsTooFarIsRefused) {
    EXPECT_EQ(kMaxExpandedBytes, std::uint64_t{2} << 30);
    TempFolder folder;
    // Mostly blanks: a few kilobytes that expand to 8 MiB.
    std::string xml = "<sequence>" + std::string(std::size_t{8} << 20, ' ') + "</sequence>";
    const std::string path = folder.Write("bomb.las", Gzip(xml, 9));
    xml.clear();
    LoadOptions options;
    options.maxExpandedBytes = std::uint64_t{1} << 20;
    EXPECT_EQ(
        ErrorOf([&] { Sequence().Load(path, {}, options); }),
        "Cannot load sequence file \"" + path + "\": the compressed data expands beyond 1 MiB");
    options.maxExpandedBytes = (std::uint64_t{8} << 20) + 21;
    EXPECT_EQ(ErrorOf([&] { Sequence().Load(path, {}, options); }), "(no error)");
    options.maxExpandedBytes = (std::uint64_t{8} << 20) + 20;
    EXPECT_EQ(ErrorOf([&] { Sequence().Load(path, {}, options); }),
              "Cannot load sequence file \"" + path +
                  "\": the compressed data expands beyond 8388628 bytes");
}

TEST(SequenceLoadErrors, AMarkupItemLongerThanTheLimitIsRefused) {
    TempFolder folder;
    const std::string path = folder.Write(
        "long.lms", "<sequence>\n<!--" + std::string(detail::XmlPieceReader::kMaxMarkupBytes, 'x') +
                        "--></sequence>");
    EXPECT_EQ(
        ErrorOf([&] { Sequence().Load(path); }),
        "Cannot load sequence file \"" + path +
            "\": line 2, column 1: a tag, comment or other markup item is longer than 64 MiB");
}

}  // namespace
}  // namespace vtr::seqlib
