#include "show/Serialize.h"

#include <gtest/gtest.h>

#include <functional>
#include <random>
#include <set>
#include <string>
#include <utility>
#include <vector>

#include "engine/VtrError.h"
#include "support/LiteralListReader.h"
#include "support/Raised.h"

namespace vtr {
namespace {

using Serialize::ListFromText;
using testsupport::RaisedNumber;
using Items = std::vector<std::string>;

// What a read gives: the items, or the number of the error raised.
struct Outcome {
    Items items;
    int32_t error = 0;
    bool loops = false;  // only the step-by-step reader can report this
};

Outcome Fast(const std::string& text) {
    try {
        return {ListFromText(text, 1).Items(), 0};
    } catch (const VtrError& e) {
        return {{}, e.Number()};
    }
}

// The defining algorithm's reading, in the same terms.
Outcome StepByStep(const std::string& text) {
    const auto reading = testsupport::ReadListLiterally(text);
    return {reading.items, reading.error,
            reading.kind == testsupport::LiteralReading::Kind::Endless};
}

void ExpectError(const std::string& text, int32_t number, const std::string& description) {
    try {
        ListFromText(text, 1);
        FAIL() << "no error for " << text;
    } catch (const VtrError& e) {
        EXPECT_EQ(e.Number(), number) << text;
        EXPECT_EQ(e.Source(), "Serialize.ListFromText");
        EXPECT_EQ(e.Description(), description) << text;
    }
}

TEST(ListFromText, ReadsTheNotation) {
    EXPECT_EQ(Fast("").items, Items{});
    EXPECT_EQ(Fast("abc").items, Items{});
    EXPECT_EQ(Fast("()").items, Items{""});
    EXPECT_EQ(Fast("(a,,b)").items, (Items{"a", "", "b"}));
    EXPECT_EQ(Fast("(2,0,1,0,,)").items, (Items{"2", "0", "1", "0", "", ""}));
    EXPECT_EQ(Fast("(a,(b,c),d)").items, (Items{"a", "(b,c)", "d"}));
    EXPECT_EQ(Fast("((x))").items, Items{"(x)"});
    EXPECT_EQ(Fast("x(a,b)y").items, (Items{"a", "b"}));
    EXPECT_EQ(Fast("( a , b )").items, (Items{" a ", " b "}));
    EXPECT_EQ(Fast("(a),b)").items, (Items{"a)", "b"}));
    EXPECT_EQ(Fast("(x(a,b)y,z)").items, (Items{"x(a,b)y", "z"}));
    EXPECT_EQ(Fast("(*S*O,(*C))").items, (Items{"*S*O", "(*C)"}));
}

TEST(ListFromText, RaisesItsFourErrors) {
    ExpectError("(a", 1, "Badly formatted list, enclosing parens");
    ExpectError("a)", 1, "Badly formatted list, enclosing parens");
    ExpectError(")a(", 1, "Badly formatted list, enclosing parens");
    ExpectError("(a,(b)", 2, "Badly formatted list, missing closing paren");
    ExpectError("(a,b(c)", 2, "Badly formatted list, missing closing paren");
    ExpectError("(a),(b)", 3, "Badly formatted list, unexpected closing paren");
    ExpectError("(((a),b)", 4, "Badly formatted list, missing closing paren");
    // A second stray ")" before a later separator has no reading; it is refused.
    ExpectError("(a)),b)", 3, "Badly formatted list, unexpected closing paren");
}

TEST(ListFromText, IndexesFromTheLowerBound) {
    const auto fields = ListFromText("(a,b,c)", 1);
    EXPECT_EQ(fields.LowerBound(), 1);
    EXPECT_EQ(fields.UpperBound(), 3);
    EXPECT_EQ(fields[1], "a");
    EXPECT_EQ(fields[3], "c");
    EXPECT_FALSE(fields.Has(0));
    EXPECT_FALSE(fields.Has(4));
    try {
        (void)fields[4];
        FAIL() << "no error";
    } catch (const VtrError& e) {
        EXPECT_EQ(e.Number(), ErrorNumbers::SubscriptOutOfRange);
    }
    const auto zeroBased = ListFromText("(a,b)", 0);
    EXPECT_EQ(zeroBased[0], "a");
    EXPECT_EQ(zeroBased.UpperBound(), 1);
    EXPECT_EQ(ListFromText("", 1).UpperBound(), 0);
}

// Random texts over the characters that matter, as flat noise and as nested lists with
// damage, read by both readers: the same items or the same error, every time.
TEST(ListFromText, AgreesWithTheStepByStepReader) {
    std::mt19937 random(20240611);
    auto noise = [&](std::size_t length) {
        static const char alphabet[] = "(),,*ab";
        std::string text;
        for (std::size_t i = 0; i < length; ++i) {
            text += alphabet[random() % (sizeof alphabet - 1)];
        }
        return text;
    };
    std::function<std::string(int)> nested = [&](int depth) {
        std::string text = "(";
        const int count = static_cast<int>(random() % 4);
        for (int i = 0; i < count; ++i) {
            if (i != 0) {
                text += ',';
            }
            text += (depth < 4 && random() % 3 == 0) ? nested(depth + 1) : noise(random() % 3);
        }
        return text + ")";
    };
    auto damage = [&](std::string text) {
        const int edits = static_cast<int>(random() % 3);
        for (int i = 0; i < edits && !text.empty(); ++i) {
            const std::size_t at = random() % text.size();
            switch (random() % 3) {
                case 0:
                    text.erase(at, 1);
                    break;
                case 1:
                    text.insert(at, 1, "(),"[random() % 3]);
                    break;
                default:
                    text[at] = "(),*a"[random() % 5];
            }
        }
        return text;
    };

    int loops = 0, errors = 0, lists = 0;
    for (int round = 0; round < 60000; ++round) {
        const std::string text = round % 2 == 0 ? noise(random() % 16) : damage(nested(0));
        const Outcome expected = StepByStep(text);
        const Outcome actual = Fast(text);
        if (expected.loops) {
            ++loops;
            EXPECT_EQ(actual.error, 3) << text;
            continue;
        }
        errors += expected.error != 0;
        lists += expected.error == 0;
        ASSERT_EQ(actual.error, expected.error) << text;
        ASSERT_EQ(actual.items, expected.items) << text;
    }
    // The generators reach every kind of outcome.
    EXPECT_GT(loops, 100);
    EXPECT_GT(errors, 1000);
    EXPECT_GT(lists, 1000);
}

TEST(ListFromText, SurvivesDeepNestingAndLongTexts) {
    const std::size_t depth = 1000000;
    const std::string deep = std::string(depth, '(') + "a,b" + std::string(depth, ')');
    const auto items = Fast(deep).items;
    ASSERT_EQ(items.size(), 1u);
    EXPECT_EQ(items[0].size(), deep.size() - 2);
    EXPECT_EQ(Fast("(x," + std::string(depth, '(') + ",y)").error, 2);
    EXPECT_EQ(Fast("(x," + std::string(depth, '(') + "a),y)").error, 4);
    EXPECT_EQ(Fast("(x," + std::string(depth, ')') + ",y)").error, 3);

    std::string wide = "(";
    for (int i = 0; i < 200000; ++i) {
        wide += i == 0 ? "" : ",";
        wide += (i % 2 == 0) ? "(n,(m))" : "v";
    }
    wide += ")";
    const auto wideItems = Fast(wide).items;
    ASSERT_EQ(wideItems.size(), 200000u);
    EXPECT_EQ(wideItems[199998], "(n,(m))");
    EXPECT_EQ(wideItems[199999], "v");
}

TEST(ListToText, JoinsItemsAsGiven) {
    EXPECT_EQ(Serialize::ListToText({}), "()");
    EXPECT_EQ(Serialize::ListToText({""}), "()");
    EXPECT_EQ(Serialize::ListToText({"a", "(b,c)", ""}), "(a,(b,c),)");
    // An empty list comes back with one empty item.
    EXPECT_EQ(Fast(Serialize::ListToText({})).items, Items{""});
}

// The four whole-text replacements, one after the other.
std::string ReplaceAll(std::string text, const std::string& from, const std::string& to) {
    std::string out;
    std::size_t pos = 0;
    for (auto at = text.find(from); at != std::string::npos; at = text.find(from, pos)) {
        out += text.substr(pos, at - pos) + to;
        pos = at + from.size();
    }
    return out + text.substr(pos);
}

TEST(Escaping, RoundTripsAndMatchesTheReplacements) {
    EXPECT_EQ(Serialize::EscapeText("a*(b),c"), "a*E*Ob*C*Sc");
    EXPECT_EQ(Serialize::EscapeText("*E"), "*EE");
    EXPECT_EQ(Serialize::EscapeText("*S"), "*ES");
    EXPECT_EQ(Serialize::UnescapeText("*ES"), "*S");
    EXPECT_EQ(Serialize::UnescapeText("**S"), "*,");
    EXPECT_EQ(Serialize::UnescapeText("*x*"), "*x*");
    EXPECT_EQ(Serialize::UnescapeText("*s"), "*s");  // case-sensitive

    std::mt19937 random(7);
    for (int round = 0; round < 20000; ++round) {
        std::string text;
        const std::size_t length = random() % 12;
        for (std::size_t i = 0; i < length; ++i) {
            text += "*(),SCOEx"[random() % 9];
        }
        EXPECT_EQ(Serialize::UnescapeText(Serialize::EscapeText(text)), text);
        std::string replaced = ReplaceAll(text, "*S", ",");
        replaced = ReplaceAll(replaced, "*C", ")");
        replaced = ReplaceAll(replaced, "*O", "(");
        replaced = ReplaceAll(replaced, "*E", "*");
        EXPECT_EQ(Serialize::UnescapeText(text), replaced) << text;
    }
}

TEST(NumbersAndBooleans, ConvertAsStored) {
    EXPECT_EQ(Serialize::LongToText(0), " 0");
    EXPECT_EQ(Serialize::LongToText(2), " 2");
    EXPECT_EQ(Serialize::LongToText(-1), "-1");
    EXPECT_EQ(Serialize::TextToLong(" 7"), 7);
    EXPECT_EQ(Serialize::TextToLong(" 7 "), 7);
    EXPECT_EQ(Serialize::TextToLong("-1"), -1);
    EXPECT_EQ(Serialize::TextToLong("2.9"), 2);
    EXPECT_EQ(Serialize::TextToLong("-1.5"), -2);
    EXPECT_EQ(Serialize::TextToLong("+4e2"), 400);
    EXPECT_EQ(Serialize::TextToLong("-2147483648"), -2147483647 - 1);
    EXPECT_EQ(RaisedNumber([] { Serialize::TextToLong(""); }), ErrorNumbers::TypeMismatch);
    EXPECT_EQ(RaisedNumber([] { Serialize::TextToLong("  "); }), ErrorNumbers::TypeMismatch);
    EXPECT_EQ(RaisedNumber([] { Serialize::TextToLong("abc"); }), ErrorNumbers::TypeMismatch);
    EXPECT_EQ(RaisedNumber([] { Serialize::TextToLong("1 2"); }), ErrorNumbers::TypeMismatch);
    EXPECT_EQ(RaisedNumber([] { Serialize::TextToLong("inf"); }), ErrorNumbers::TypeMismatch);
    EXPECT_EQ(RaisedNumber([] { Serialize::TextToLong("2147483648"); }), ErrorNumbers::Overflow);
    EXPECT_EQ(RaisedNumber([] { Serialize::TextToLong("1e999"); }), ErrorNumbers::Overflow);
    EXPECT_EQ(Serialize::TextToLong("1e-999"), 0);

    EXPECT_EQ(Serialize::LeadingNumber("12abc"), 12);
    EXPECT_EQ(Serialize::LeadingNumber("  -3.5x"), -3.5);
    EXPECT_EQ(Serialize::LeadingNumber("abc"), 0);
    EXPECT_EQ(Serialize::LeadingNumber(""), 0);
    EXPECT_EQ(Serialize::RoundToLong(2.5), 2);
    EXPECT_EQ(Serialize::RoundToLong(3.5), 4);
    EXPECT_EQ(Serialize::RoundToLong(-2.5), -2);
    EXPECT_EQ(RaisedNumber([] { Serialize::RoundToLong(3e9); }), ErrorNumbers::Overflow);

    EXPECT_EQ(Serialize::BoolToText(true), "T");
    EXPECT_EQ(Serialize::BoolToText(false), "F");
    EXPECT_TRUE(Serialize::TextToBool("T"));
    EXPECT_TRUE(Serialize::TextToBool("t"));
    EXPECT_FALSE(Serialize::TextToBool("True"));
    EXPECT_FALSE(Serialize::TextToBool(""));
    EXPECT_FALSE(Serialize::TextToBool("F"));
}

}  // namespace
}  // namespace vtr
