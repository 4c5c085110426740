#include "sequencelib/XmlPieceReader.h"

#include <gtest/gtest.h>

#include <random>

#include "SeqTestFiles.h"
#include "sequencelib/Sequence.h"

namespace vtr::seqlib {
namespace {

using testing::ErrorOf;
using testing::TempFolder;

// Everything a load keeps, as one text, so that two loads can be compared.
std::string Summary(const Sequence& s) {
    std::string text = std::to_string(s.Length()) + "|" + s.Media() + "|" + s.ShellCommand() + "\n";
    for (const auto& c : s.Channels()) {
        text += c->Id() + "," + c->Name() + "," + c->SettingsKey() + "," +
                std::to_string(c->Circuits()) + "," + std::to_string(c->ChannelType()) + "," +
                c->SubsequenceFile() + (c->IsEverOn() ? ",on\n" : ",off\n");
    }
    for (const auto& t : s.Tracks()) {
        text += "track " + t->Name() + " " + std::to_string(t->Length()) + ":";
        for (const auto& c : t->Channels())
            text += " " + c->Id();
        text += "\n";
    }
    for (const auto& file : {s.GridcraftFile(), s.NovaluxFile()}) {
        if (!file)
            continue;
        text += std::string(IntensityFileKindName(file->Kind())) + " " + file->Name() + " on " +
                std::to_string(file->TrackIndex()) + ":";
        for (const auto& d : file->Devices()) {
            text += " " + std::to_string(d.DeviceType()) + "/" + std::to_string(d.Network()) + "/" +
                    std::to_string(d.StartAddress()) + "+" + std::to_string(d.NumAddresses());
        }
        text += "\n";
    }
    return text;
}

// The summary of a load, or its error (without the file name).
std::string Outcome(const std::string& path, std::size_t pieceBytes, bool plainMarkup = true) {
    LoadOptions options;
    options.pieceBytes = pieceBytes;
    options.plainMarkup = plainMarkup;
    Sequence s;
    try {
        s.Load(path, {}, options);
    } catch (const VtrError& e) {
        return "error: " + e.Description().substr(e.Description().find("\": ") + 3);
    }
    return Summary(s);
}

// Markup that hides tags from a careless scan: comments, CDATA, processing instructions
// and attribute values holding "<", ">", "/>" and end tags; elements too large for a
// piece; text longer than a piece; events written with end tags.
const char* const kTricky = R"(<?xml version="1.0"?>
<!-- </sequence> --><sequence length="1000" media="a&amp;b.mp3" shellCommand="7">
  <channels>
    <!-- <channel id="fake"/> </channel> -->
    <channel id="1" name="a &gt; b /&gt; &lt;/channel&gt;" deviceType="1" unit="3" circuit="4">
      <event start="0" end="10" intensity="5"></event>
      <?note </channel> ?>
      <![CDATA[ </channel> <channel id="cdata"/> ]]>
      <note text="</channel>" other='/>'/>
    </channel>
    <channel id="2" name='quote " inside' deviceType="7" network="9" circuit="500"><event start="5" end="6" from="0" to="1"/></channel>
    <channel id="3" type="6" subsequence="Sub.las">
      <event start="2000" end="3000" intensity="100"/>
      <wrapper><inner><deeper a=">"/></inner></wrapper>
    </channel>
    Some text between channels that is longer than a small piece of the document, and more.
    <channel id="4" name="last" deviceType="3" unit="255"/>
  </channels>
  <tracks>
    <track name="T1" length="900"><channelRef id="1"/><channelRef id="3"/>
      <intensityFile kind="Gridcraft" name="g.gci"><device deviceType="7" network="2" start="10" count="3"/><device/></intensityFile>
    </track>
    <track name="T2"><channelRef id="1"/><channelRef id="4"/><channelRef id="2"/>
      <intensityFile kind="Novalux" name="n.nvx"></intensityFile>
    </track>
  </tracks>
</sequence>
<!-- the end -->
)";

TEST(XmlPieceReader, EveryPieceSizeReadsTheSameSequence) {
    TempFolder folder;
    const std::string path = folder.Write("tricky.lms", kTricky);
    const std::string whole = Outcome(path, std::size_t{1} << 20);
    ASSERT_EQ(whole.rfind("error", 0), std::string::npos) << whole;
    EXPECT_NE(whole.find("1,a > b /> </channel>,1:0:3:4,1,0,,on"), std::string::npos) << whole;
    EXPECT_NE(whole.find("3,,,1,6,Sub.las,off"), std::string::npos) << whole;
    EXPECT_EQ(whole.find("fake"), std::string::npos);
    EXPECT_EQ(whole.find("cdata"), std::string::npos);
    for (std::size_t piece = 16; piece <= 400; piece += 7) {
        EXPECT_EQ(Outcome(path, piece), whole) << "pieces of " << piece;
    }
}

TEST(XmlPieceReader, CompressedTextIsCutTheSameWay) {
    TempFolder folder;
    const std::string plain = folder.Write("tricky.lms", kTricky);
    const std::string packed = folder.Write("tricky.las", testing::Gzip(kTricky));
    for (const std::size_t piece : {std::size_t{16}, std::size_t{53}, std::size_t{1} << 20}) {
        EXPECT_EQ(Outcome(packed, piece), Outcome(plain, piece)) << piece;
    }
}

// Damage the document one byte at a time: whatever the pieces, the load accepts the same
// documents and reads them the same way, and refuses the same documents.
TEST(XmlPieceReader, DamagedDocumentsAreJudgedAlikeWhateverThePieces) {
    TempFolder folder;
    const std::string original = kTricky;
    std::mt19937 random(20240611);
    const std::string bytes = "<>/\"'=!-?[]& x";
    int refused = 0;
    for (int round = 0; round < 400; ++round) {
        std::string text = original;
        const std::size_t at = random() % text.size();
        switch (random() % 3) {
            case 0:
                text.erase(at, 1);
                break;
            case 1:
                text.insert(at, 1, bytes[random() % bytes.size()]);
                break;
            default:
                text[at] = bytes[random() % bytes.size()];
                break;
        }
        const std::string path = folder.Write("damaged.lms", text);
        const std::string whole = Outcome(path, std::size_t{1} << 20);
        const bool wholeRefused = whole.rfind("error", 0) == 0;
        refused += wholeRefused;
        for (const std::size_t piece : {std::size_t{16}, std::size_t{61}}) {
            const std::string cut = Outcome(path, piece);
            const bool cutRefused = cut.rfind("error", 0) == 0;
            EXPECT_EQ(cutRefused, wholeRefused)
                << "round " << round << ", pieces of " << piece << "\n"
                << text << "\nwhole: " << whole << "\ncut: " << cut;
            if (!cutRefused && !wholeRefused) {
                EXPECT_EQ(cut, whole) << text;
            }
        }
    }
    EXPECT_GT(refused, 100) << "the damage should break many documents";
}

// A sequence written plainly, as the suite writes them, with the liberties markup allows:
// blanks around "=" and before "/>" and ">", single quotes, the other quote inside a value,
// line breaks and tabs between attributes, names with '-', '.', ':' and digits, elements
// the loader does not know, text between elements.
const char* const kPlain = R"(<?xml version="1.0" encoding="UTF-8"?>
<sequence formatVersion="1" length="4000" media='song "live".mp3'>
  <channels>
    <channel id="1" name="Arch left" deviceType="1" network="0" unit="1" circuit="1">
      <event start="0" end="2000" intensity="40"/>
      <event start = "2000"	end='4000' intensity="0" />
    </channel>
    <channel id="2" name='Tree' deviceType="3"
             network="2" circuit="17" circuits="3"><event start="10" end="20" from="0" to="100"></event></channel>
    <channel id="sub-1.x" type="6" subsequence="Sub.las" x:note="a > b"/>
    <my-data.v2 a1="1"><nested><channel id="not-one"/></nested> loose text </my-data.v2>
    <channel id="4" name="Star" deviceType="1" unit="255" circuit="32767"><event start="-5" end="1" intensity="100"/></channel >
  </channels>
  <tracks>
    <track name="Main" length="3000"><channelRef id="1"/><channelRef id="sub-1.x"/><channelRef id="4"/>
      <intensityFile kind="Gridcraft" name="g.gci"><device deviceType="7" network="2" start="10" count="3"/></intensityFile>
    </track>
    <track name="Second"><channelRef id="2"/><channelRef id="1"/></track>
  </tracks>
</sequence>
)";

// Plain markup is read in a pass of its own, and anything else by pugixml: both ways must
// read every document alike and refuse every other one with the same message and place,
// whatever the pieces. The damage makes text that is plain and well-formed, plain and
// broken, or not plain at all, in every part of a tag.
TEST(XmlPieceReader, PlainMarkupIsReadAsPugixmlReadsIt) {
    TempFolder folder;
    for (const char* original : {kPlain, kTricky}) {
        const std::string path = folder.Write("plain.lms", original);
        for (const std::size_t piece : {std::size_t{16}, std::size_t{97}, std::size_t{1} << 20})
            EXPECT_EQ(Outcome(path, piece, true), Outcome(path, piece, false)) << piece;
    }
    const std::string plainWhole = Outcome(folder.Write("plain.lms", kPlain), std::size_t{1} << 20);
    EXPECT_NE(plainWhole.find("sub-1.x,,,1,6,Sub.las,off"), std::string::npos) << plainWhole;
    EXPECT_EQ(plainWhole.find("not-one"), std::string::npos) << plainWhole;

    std::mt19937 random(20261124);
    std::string bytes = "<>/\"'=&;#x :-.1a\t\n\r\x80\x1f";
    bytes += '\0';
    int refused = 0;
    const std::string original = kPlain;
    for (int round = 0; round < 700; ++round) {
        std::string text = original;
        for (int damage = 0; damage <= round % 2; ++damage) {
            const std::size_t at = random() % text.size();
            const char byte = bytes[random() % bytes.size()];
            switch (random() % 3) {
                case 0:
                    text.erase(at, 1);
                    break;
                case 1:
                    text.insert(at, 1, byte);
                    break;
                default:
                    text[at] = byte;
                    break;
            }
        }
        const std::string path = folder.Write("damaged.lms", text);
        for (const std::size_t piece : {std::size_t{16}, std::size_t{61}, std::size_t{1} << 20}) {
            const std::string plain = Outcome(path, piece, true);
            EXPECT_EQ(plain, Outcome(path, piece, false))
                << "round " << round << ", pieces of " << piece << "\n"
                << text;
            refused += plain.rfind("error", 0) == 0;
        }
    }
    EXPECT_GT(refused, 300) << "the damage should break many documents";
}

// Elements the loader does not know, nested `depth` deep between two channels; inside them a
// channel that is not the sequence's (it is not a child of <channels>).
std::string NestedBetweenChannels(int depth) {
    std::string text = R"(<sequence length="10"><channels><channel id="1">)"
                       R"(<event start="0" end="5" intensity="3"/></channel>)";
    for (int i = 0; i < depth; ++i)
        text += "<wrap>";
    text += R"(<channel id="inner"/>)";
    for (int i = 0; i < depth; ++i)
        text += "</wrap>";
    return text + R"(<channel id="2"/></channels><tracks><track><channelRef id="2"/>)"
                  R"(</track></tracks></sequence>)";
}

TEST(XmlPieceReader, DeepNestingReadsTheSameInEveryPieceSize) {
    TempFolder folder;
    const std::string path = folder.Write("deep.lms", NestedBetweenChannels(20000));
    const std::string whole = Outcome(path, std::size_t{1} << 20);
    EXPECT_EQ(whole, "10||\n1,,,1,0,,on\n2,,,1,0,,off\ntrack  10: 2\n");
    for (const std::size_t piece : {16, 64, 1000, 4096, 100000})
        EXPECT_EQ(Outcome(path, piece), whole) << "pieces of " << piece;
}

TEST(XmlPieceReader, NestingBeyondTheLimitIsRefusedAtTheTagThatGoesTooDeep) {
    TempFolder folder;
    // <sequence> is at depth 1, <channels> at 2, the n-th <wrap> at 2 + n.
    const auto load = [&](int wraps, int32_t maxDepth, std::size_t piece) {
        LoadOptions options;
        options.maxDepth = maxDepth;
        options.pieceBytes = piece;
        std::string text = "<sequence length=\"10\"><channels>";
        for (int i = 0; i < wraps; ++i)
            text += "<wrap>";
        text += "<w/>";
        for (int i = 0; i < wraps; ++i)
            text += "</wrap>";
        const std::string path = folder.Write("deep.lms", text + "</channels></sequence>");
        const std::string error = ErrorOf([&] { Sequence().Load(path, {}, options); });
        const std::string prefix = "Cannot load sequence file \"" + path + "\": ";
        return error.rfind(prefix, 0) == 0 ? error.substr(prefix.size()) : error;
    };
    for (const std::size_t piece : {std::size_t{16}, std::size_t{1} << 20}) {
        EXPECT_EQ(load(47, 50, piece), "(no error)") << piece;
        // The empty element <w/> goes one deeper than the last <wrap>.
        EXPECT_EQ(load(48, 50, piece),
                  "line 1, column 321: the elements are nested more than 50 levels deep")
            << piece;
        EXPECT_EQ(load(49, 50, piece),
                  "line 1, column 321: the elements are nested more than 50 levels deep")
            << piece;
    }
    EXPECT_EQ(kMaxNestingDepth, 100000);
    EXPECT_EQ(load(99997, kMaxNestingDepth, std::size_t{1} << 20), "(no error)");
    EXPECT_EQ(load(99998, kMaxNestingDepth, std::size_t{1} << 20),
              "line 1, column " + std::to_string(32 + 99998 * 6 + 1) +
                  ": the elements are nested more than 100000 levels deep");
}

}  // namespace
}  // namespace vtr::seqlib
