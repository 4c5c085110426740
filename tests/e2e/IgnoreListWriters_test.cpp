// Twenty `vantori-verify ignore` and `unignore` processes change the ignore lists of one
// settings store at the same moment, fifty rounds over. Every change a process reported as
// made is in the store, every entry no process touched is still there (in its order), and
// nothing else in the store changed by a byte: each change is one read-modify-write of the
// whole store under its lock, so no writer loses what another one wrote.

#include <gtest/gtest.h>

#include <algorithm>
#include <cstdio>
#include <filesystem>
#include <set>
#include <string>
#include <vector>

#include "engine/IgnoreLists.h"
#include "engine/LibVerify.h"
#include "environment/RegistryFile.h"
#include "support/TempStore.h"

#ifndef _WIN32
#include <fcntl.h>
#include <spawn.h>
#include <sys/wait.h>
#include <unistd.h>

#include <cerrno>

extern char** environ;
#endif

namespace vtr {
namespace {

#ifndef _WIN32

namespace fs = std::filesystem;

constexpr int kWriters = 20;
constexpr int kRounds = 50;

// What one writer does in one round.
struct Change {
    bool ignore = true;
    bool messageNumber = true;  // else a result's key
    std::string entry;          // the number's text or the key
};

// Message numbers of the catalog (which "ignore" takes) that the rounds ignore in turn: each
// round ignores one set and un-ignores the other, which the round before ignored.
const int kNumberSets[2][4] = {{1, 2, 4, 5}, {6, 7, 9, 10}};

// Round r, writer w: four ignore message numbers, four un-ignore the numbers of the round
// before, four un-ignore numbers the store was given for them, five ignore result keys and
// three un-ignore keys the store was given for them.
Change ChangeOf(int round, int writer) {
    const std::string tag = "r" + std::to_string(round) + "w" + std::to_string(writer);
    if (writer < 4)
        return {true, true, std::to_string(kNumberSets[round % 2][writer])};
    if (writer < 8)
        return {false, true, std::to_string(kNumberSets[(round + 1) % 2][writer - 4])};
    if (writer < 12)
        return {false, true, std::to_string(5000 + round * kWriters + writer)};
    if (writer < 17)
        return {true, false, "7-[FILE]: /shows/" + tag + ".lss / "};
    return {false, false, "8-[SEQUENCE]: /sequences/" + tag + ".lms / "};
}

// The part of the store that no ignore command may change: other keys, another root,
// comments, a value type the program never reads.
const std::string kUntouched =
    "Windows Registry Editor Version 5.00\r\n"
    "\r\n"
    "; exported from the show computer\r\n"
    "[HKEY_CURRENT_USER\\Software\\Vantori\\Shared]\r\n"
    "\"AppPath\"=\"C:\\\\Program Files\\\\Vantori\\\\\"\r\n"
    "\"UserDataPath\"=\"D:\\\\Shows\\\\\"\r\n"
    "\"PostInstall\"=dword:00000001\r\n"
    "\"Binary\"=hex:01,02,03,\\\r\n"
    "  04,05\r\n"
    "\r\n"
    "[HKEY_LOCAL_MACHINE\\Software\\Other]\r\n"
    "\"Foreign\"=\"not ours\"\r\n"
    "\r\n";

// The lists the store starts with: entries nobody touches around the ones the rounds remove.
std::vector<std::string> InitialNumbers() {
    std::vector<std::string> numbers{"3"};
    for (const int number : kNumberSets[1])  // the first round un-ignores these
        numbers.push_back(std::to_string(number));
    for (int round = 0; round < kRounds; ++round) {
        for (int writer = 8; writer < 12; ++writer)
            numbers.push_back(ChangeOf(round, writer).entry);
        if (round % 10 == 5)
            numbers.push_back(std::to_string(100 + round));
    }
    numbers.push_back("41");
    return numbers;
}

std::vector<std::string> InitialKeys() {
    std::vector<std::string> keys{"1-untouched / "};
    for (int round = 0; round < kRounds; ++round) {
        for (int writer = 0; writer < kWriters; ++writer) {
            const Change change = ChangeOf(round, writer);
            if (!change.ignore && !change.messageNumber)
                keys.push_back(change.entry);
        }
    }
    keys.push_back("2-untouched / with / separators / ");
    return keys;
}

std::string InitialStore() {
    std::string text = kUntouched + "[HKEY_CURRENT_USER\\Software\\Vantori\\Verifier]\r\n";
    const std::vector<std::string> numbers = InitialNumbers();
    const std::vector<std::string> keys = InitialKeys();
    text +=
        "\"CountIgnoreMsgNum\"=" + RegistryFile::DwordText(static_cast<uint32_t>(numbers.size())) +
        "\r\n";
    for (std::size_t n = 0; n < numbers.size(); ++n)
        text += "\"IgnoreMsgNum" + std::to_string(n + 1) +
                "\"=" + RegistryFile::QuotedText(numbers[n]) + "\r\n";
    text += "\"CountIgnoreMsg\"=" + RegistryFile::DwordText(static_cast<uint32_t>(keys.size())) +
            "\r\n";
    for (std::size_t n = 0; n < keys.size(); ++n)
        text += "\"IgnoreMsg" + std::to_string(n + 1) + "\"=" + RegistryFile::QuotedText(keys[n]) +
                "\r\n";
    return text;
}

// Starts the program with the arguments, its output going to the files given.
pid_t Start(const std::vector<std::string>& arguments, const std::string& out,
            const std::string& err) {
    std::vector<char*> argv;
    for (const std::string& argument : arguments)
        argv.push_back(const_cast<char*>(argument.c_str()));
    argv.push_back(nullptr);
    posix_spawn_file_actions_t files;
    posix_spawn_file_actions_init(&files);
    posix_spawn_file_actions_addopen(&files, 1, out.c_str(), O_WRONLY | O_CREAT | O_TRUNC, 0600);
    posix_spawn_file_actions_addopen(&files, 2, err.c_str(), O_WRONLY | O_CREAT | O_TRUNC, 0600);
    pid_t pid = -1;
    if (posix_spawn(&pid, argv[0], &files, nullptr, argv.data(), environ) != 0)
        pid = -1;
    posix_spawn_file_actions_destroy(&files);
    return pid;
}

int ExitStatus(pid_t pid) {
    int status = 0;
    while (::waitpid(pid, &status, 0) < 0 && errno == EINTR) {
    }
    return WIFEXITED(status) ? WEXITSTATUS(status) : -1;
}

// Entries of the first list in the order the second one holds them.
std::vector<std::string> InOrderOf(const std::vector<std::string>& wanted,
                                   const std::vector<std::string>& holder) {
    const std::set<std::string> set(wanted.begin(), wanted.end());
    std::vector<std::string> out;
    for (const std::string& entry : holder) {
        if (set.count(entry) != 0)
            out.push_back(entry);
    }
    return out;
}

class IgnoreListWriters : public testsupport::StoreTest {};

TEST_F(IgnoreListWriters, TwentyProcessesAtOnceLoseNoChange) {
    const std::string program = VTR_BINARY_DIR "/src/cli/vantori-verify";
    const std::string store = folder_.File("store/registry.reg");
    const std::string output = folder_.File("output");
    fs::create_directories(folder_.File("store"));
    fs::create_directories(output);
    testsupport::WriteFileBytes(store, InitialStore());
    testsupport::ScopedStore reading(store);

    std::vector<std::string> numbers = InitialNumbers();
    std::vector<std::string> keys = InitialKeys();
    const std::vector<std::string> untouchedNumbers = {"3",   "105", "115", "125",
                                                       "135", "145", "41"};
    const std::vector<std::string> untouchedKeys = {"1-untouched / ",
                                                    "2-untouched / with / separators / "};

    for (int round = 0; round < kRounds; ++round) {
        std::vector<pid_t> writers;
        for (int writer = 0; writer < kWriters; ++writer) {
            const Change change = ChangeOf(round, writer);
            const std::string name = output + "/" + std::to_string(writer);
            writers.push_back(Start(
                {program, change.ignore ? "ignore" : "unignore",
                 change.messageNumber ? "--message" : "--key", change.entry, "--registry", store},
                name + ".out", name + ".err"));
            ASSERT_GT(writers.back(), 0) << "cannot start " << program;
        }
        for (int writer = 0; writer < kWriters; ++writer) {
            const Change change = ChangeOf(round, writer);
            const std::string name = output + "/" + std::to_string(writer);
            // Each process confirms its change; one that could not make it would say so and
            // exit with 3, and its change must then be absent.
            const int status = ExitStatus(writers[static_cast<std::size_t>(writer)]);
            const std::string said = testsupport::ReadFileBytes(name + ".out");
            ASSERT_EQ(status, 0) << "round " << round << ", writer " << writer << ": "
                                 << testsupport::ReadFileBytes(name + ".err");
            EXPECT_NE(said.find(change.ignore ? " will be ignored." : " no longer ignored."),
                      std::string::npos)
                << said;
            std::vector<std::string>& list = change.messageNumber ? numbers : keys;
            if (change.ignore)
                list.push_back(change.entry);
            else
                list.erase(std::remove(list.begin(), list.end(), change.entry), list.end());
        }

        // The lists as a verification would read them.
        LibVerify::IgnoredMessageNumbers().Clear();
        LibVerify::IgnoredResultKeys().Clear();
        IgnoreLists::LoadIgnoreLists();
        const std::vector<std::string>& storedNumbers =
            LibVerify::IgnoredMessageNumbers().Entries();
        const std::vector<std::string>& storedKeys = LibVerify::IgnoredResultKeys().Entries();
        ASSERT_EQ(std::set<std::string>(storedNumbers.begin(), storedNumbers.end()),
                  std::set<std::string>(numbers.begin(), numbers.end()))
            << "round " << round;
        ASSERT_EQ(std::set<std::string>(storedKeys.begin(), storedKeys.end()),
                  std::set<std::string>(keys.begin(), keys.end()))
            << "round " << round;
        EXPECT_EQ(InOrderOf(untouchedNumbers, storedNumbers), untouchedNumbers);
        EXPECT_EQ(InOrderOf(untouchedKeys, storedKeys), untouchedKeys);
    }

    const std::string after = testsupport::ReadFileBytes(store);
    EXPECT_EQ(after.substr(0, kUntouched.size()), kUntouched);
    std::vector<std::string> left;
    for (const auto& entry : fs::directory_iterator(folder_.File("store")))
        left.push_back(entry.path().filename().string());
    EXPECT_EQ(left, std::vector<std::string>{"registry.reg"}) << "nothing left beside the store";
    LibVerify::IgnoredMessageNumbers().Clear();
    LibVerify::IgnoredResultKeys().Clear();
}

#endif

}  // namespace
}  // namespace vtr
