#include "ProgressLine.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <sstream>

namespace vtr::cli {
namespace {

using namespace std::chrono_literals;

// A clock that the test moves by hand.
struct ManualClock {
    std::chrono::steady_clock::time_point now{};
    ProgressLine::Clock Function() {
        return [this] { return now; };
    }
};

class ProgressLineTest : public ::testing::Test {
  protected:
    std::string Take() {
        std::string text = out.str();
        out.str("");
        return text;
    }

    std::ostringstream out;
    ManualClock clock;
};

TEST_F(ProgressLineTest, DrawsAtOnceThenAtMostOncePerInterval) {
    ProgressLine line(out, 80, clock.Function(), 100ms);
    line.SetCounts(3, 12);
    line.SetCurrent("Show file existence: a.lss");
    line.Tick();
    EXPECT_EQ(Take(), "\r3 checks performed, 12 remaining: Show file existence: a.lss");

    line.SetCounts(4, 11);
    clock.now += 50ms;
    line.Tick();
    EXPECT_EQ(Take(), "");  // too soon

    clock.now += 50ms;
    line.Tick();
    EXPECT_EQ(Take(), "\r4 checks performed, 11 remaining: Show file existence: a.lss");

    clock.now += 1s;
    line.Tick();
    EXPECT_EQ(Take(), "");  // nothing changed
}

TEST_F(ProgressLineTest, AShorterLineCoversTheLongerOneAndEraseBlanksIt) {
    ProgressLine line(out, 80, clock.Function(), 100ms);
    line.SetCounts(1, 1);
    line.SetCurrent("abcdef");
    line.Tick();
    EXPECT_EQ(Take(), "\r1 check performed, 1 remaining: abcdef");

    line.SetCurrent("ab");
    clock.now += 200ms;
    line.Tick();
    EXPECT_EQ(Take(),
              "\r1 check performed, 1 remaining: ab    \r1 check performed, 1 remaining: ab");

    line.Erase();
    EXPECT_EQ(Take(), "\r" + std::string(34, ' ') + "\r");
    line.Erase();
    EXPECT_EQ(Take(), "");  // already gone

    // After an erase (a log line was written) the next tick puts the line back.
    clock.now += 200ms;
    line.Tick();
    EXPECT_EQ(Take(), "\r1 check performed, 1 remaining: ab");
}

TEST_F(ProgressLineTest, TheLineFitsTheTerminalWithoutCuttingACharacter) {
    ProgressLine line(out, 30, clock.Function());
    line.SetCounts(120, 4000);
    line.SetCurrent("Sequence file loads: /shows/Snowfall.las");
    EXPECT_EQ(line.Text(), "120 checks performed, 4000 re");  // 29 columns: the last stays free
    line.Tick();
    EXPECT_EQ(Take(), "\r120 checks performed, 4000 re");

    EXPECT_EQ(FitToColumns("Schl\xc3\xbc\xc3\xbc\x65l", 5), "Schl\xc3\xbc");
    EXPECT_EQ(FitToColumns("Schl\xc3\xbc\xc3\xbc\x65l", 4), "Schl");
    EXPECT_EQ(FitToColumns("\xe2\x82\xac\xe2\x82\xac", 1), "\xe2\x82\xac");
    EXPECT_EQ(FitToColumns("short", 80), "short");
    EXPECT_EQ(CharacterCount("Schl\xc3\xbc\xc3\xbc\x65l"), 8u);
}

}  // namespace
}  // namespace vtr::cli
