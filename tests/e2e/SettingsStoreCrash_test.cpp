// The settings store file under writers that are killed at random moments while other
// processes read it. Whatever the moment of the kill, every read gives a whole version of
// the store, byte for byte: the parts nobody changes exactly as they were and each changed
// value as one write left it, never part of one. No change that a writer saw succeed is
// lost, and what killed writers leave behind is cleared by the next write.
//
// The results report alike: killed while they save it, writers leave the report of one whole
// save, and the next save clears what they left beside it.

#include <gtest/gtest.h>

#include <cstdio>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <optional>
#include <ostream>
#include <random>
#include <string>
#include <vector>

#include "engine/LibVerify.h"
#include "engine/ResultsReport.h"
#include "environment/LibRegistry.h"
#include "environment/RegistryFile.h"
#include "environment/RegistryStore.h"
#include "support/TempStore.h"

#ifndef _WIN32
#include <fcntl.h>
#include <poll.h>
#include <signal.h>
#include <sys/wait.h>
#include <unistd.h>

#include <chrono>
#include <thread>
#endif

namespace vtr {
namespace {

namespace fs = std::filesystem;

constexpr const char* kCrashKey = "Software\\Vantori\\Crash";
constexpr char kWriters[] = {'A', 'B'};

std::string ValueName(char writer) {
    return std::string("Payload") + writer;
}

// The value a writer sets at its generation n: its name and number, then a body whose
// letter and length follow from n, so that a value cut short or mixed from two writes is
// told from a whole one. Large, so that a write takes a while and kills land inside it.
std::string Payload(char writer, int64_t n) {
    return std::string("writer ") + writer + " generation " + std::to_string(n) + " " +
           std::string(30000 + static_cast<std::size_t>(n % 13) * 1000,
                       static_cast<char>('a' + n % 26)) +
           " end";
}

// The generation of a whole value of the writer; nothing for anything else.
std::optional<int64_t> GenerationOf(char writer, const std::string& value) {
    const std::string prefix = std::string("writer ") + writer + " generation ";
    if (value.rfind(prefix, 0) != 0)
        return std::nullopt;
    const std::size_t end = value.find(' ', prefix.size());
    if (end == std::string::npos || end == prefix.size() || end - prefix.size() > 9)
        return std::nullopt;
    int64_t n = 0;
    for (std::size_t i = prefix.size(); i < end; ++i) {
        if (value[i] < '0' || value[i] > '9')
            return std::nullopt;
        n = n * 10 + (value[i] - '0');
    }
    if (value != Payload(writer, n))
        return std::nullopt;
    return n;
}

enum class Encoding { Utf8, Utf16 };

// The store with the payloads at generations a and b, in the file's encoding: other keys, a
// foreign root, comments, continued lines and value types the program never changes, and the
// two payloads, each on the line that a write replaces.
std::string StoreBytes(Encoding encoding, int64_t a, int64_t b) {
    const std::string text =
        "Windows Registry Editor Version 5.00\r\n\r\n"
        "; kept exactly as it is\r\n"
        "[HKEY_CURRENT_USER\\Software\\Vantori\\Shared]\r\n"
        "\"AppPath\"=\"C:\\\\Program Files\\\\Vantori\\\\\"\r\n"
        "\"PostInstall\"=dword:00000001\r\n"
        "\"Binary\"=hex:01,02,03,\\\r\n  04,05\r\n\r\n"
        "[HKEY_LOCAL_MACHINE\\Software\\Other]\r\n"
        "\"Foreign\"=\"not ours\"\r\n\r\n"
        "[HKEY_CURRENT_USER\\Software\\Vantori\\Crash]\r\n"
        "\"PayloadA\"=\"" +
        Payload('A', a) + "\"\r\n\"Between\"=\"stays\"\r\n\"PayloadB\"=\"" + Payload('B', b) +
        "\"\r\n\r\n[HKEY_CURRENT_USER\\Software\\Vantori\\Verifier]\r\n"
        "\"CountIgnoreMsg\"=dword:00000000\r\n";
    if (encoding == Encoding::Utf8)
        return text;
    std::string bytes("\xFF\xFE", 2);
    for (const char c : text) {
        bytes += c;
        bytes += '\0';
    }
    return bytes;
}

// What one read of the whole file shows: the two generations when the bytes are exactly a
// version of the store, else nothing.
std::optional<std::pair<int64_t, int64_t>> VersionOf(Encoding encoding, const std::string& bytes) {
    const RegistryFile::Document document = RegistryFile::Document::Parse(bytes);
    const RegistryFile::Key* key = document.FindKey(RegistryFile::SplitKeyPath(kCrashKey));
    if (!document.Understood() || key == nullptr)
        return std::nullopt;
    int64_t generations[2] = {0, 0};
    for (int i = 0; i < 2; ++i) {
        auto value = key->values.find(RegistryFile::Fold(ValueName(kWriters[i])));
        if (value == key->values.end() || value->second.value.data.empty())
            return std::nullopt;
        std::string text = value->second.value.data;
        text.pop_back();  // the terminating NUL
        const std::optional<int64_t> n = GenerationOf(kWriters[i], text);
        if (!n)
            return std::nullopt;
        generations[i] = *n;
    }
    if (bytes != StoreBytes(encoding, generations[0], generations[1]))
        return std::nullopt;
    return std::make_pair(generations[0], generations[1]);
}

#ifndef _WIN32

void PrintTo(Encoding encoding, std::ostream* out) {
    *out << (encoding == Encoding::Utf8 ? "UTF-8" : "UTF-16LE");
}

std::string ReadAllBytes(const std::string& path) {
    std::ifstream in(path, std::ios::binary);
    return std::string(std::istreambuf_iterator<char>(in), std::istreambuf_iterator<char>());
}

// A child process of the test; it never returns into the test program.
template <typename Body>
pid_t Spawn(Body&& body) {
    const pid_t pid = ::fork();
    if (pid == 0) {
        int status = 1;
        try {
            status = body();
        } catch (...) {
        }
        ::_exit(status);
    }
    return pid;
}

int WaitFor(pid_t pid) {
    int status = 0;
    while (::waitpid(pid, &status, 0) < 0 && errno == EINTR) {
    }
    return status;
}

void WriteLine(int fd, const std::string& line) {
    const std::string text = line + "\n";
    for (std::size_t done = 0; done < text.size();) {
        const ssize_t n = ::write(fd, text.data() + done, text.size() - done);
        if (n <= 0)
            return;
        done += static_cast<std::size_t>(n);
    }
}

std::string ReadToEnd(int fd) {
    std::string text;
    char buffer[4096];
    for (;;) {
        const ssize_t n = ::read(fd, buffer, sizeof buffer);
        if (n < 0 && errno == EINTR)
            continue;
        if (n <= 0)
            break;
        text.append(buffer, static_cast<std::size_t>(n));
    }
    return text;
}

// The last generation a writer reported as written (each success is one line), or `before`.
int64_t LastReported(const std::string& reports, int64_t before) {
    int64_t last = before;
    std::size_t start = 0;
    for (std::size_t end; (end = reports.find('\n', start)) != std::string::npos; start = end + 1)
        last = std::stoll(reports.substr(start, end - start));
    return last;
}

class SettingsStoreCrash : public testsupport::StoreTest,
                           public ::testing::WithParamInterface<Encoding> {
  protected:
    SettingsStoreCrash()
        : storeFolder_(folder_.File("store")),
          storePath_(storeFolder_ + "/registry.reg"),
          store_(storePath_) {
        fs::create_directories(storeFolder_);
        testsupport::WriteFileBytes(storePath_, StoreBytes(GetParam(), 0, 0));
    }

    // A writer: continues its value from the generation the store holds, one write after
    // another through the settings API, and reports each one that succeeded. It stops after
    // `writes` writes, when it is not killed first.
    pid_t StartWriter(char writer, int reportFd, int writes) {
        return Spawn([&, writer, reportFd, writes] {
            const std::string current = LibRegistry::GetRegString(LibRegistry::kCurrentUser,
                                                                  kCrashKey, ValueName(writer), "");
            const std::optional<int64_t> from = GenerationOf(writer, current);
            if (!from)
                return 3;
            for (int64_t n = *from + 1; n <= *from + writes; ++n) {
                LibRegistry::SetRegString(LibRegistry::kCurrentUser, kCrashKey, ValueName(writer),
                                          Payload(writer, n));
                WriteLine(reportFd, std::to_string(n));
            }
            return 0;
        });
    }

    // A reader: reads the store until the stop pipe closes (or, should the test go wrong, for
    // two minutes at most). Kind 0 reads the file's bytes
    // afresh each time; kind 1 asks a store object of its own for both values, as the
    // verifier does. Every read must be a whole version, and versions never go back. The
    // outcome goes to the result file: "ok <reads> <versions seen>" or what went wrong.
    pid_t StartReader(int kind, const int stop[2], const std::string& resultFile) {
        const int stopFd = stop[0];
        const int stopWriteFd = stop[1];
        return Spawn([&, kind, stopFd, stopWriteFd, resultFile] {
            // Only the test holds the write end, so that closing it is seen here.
            ::close(stopWriteFd);
            const auto deadline = std::chrono::steady_clock::now() + std::chrono::minutes(2);
            const Encoding encoding = GetParam();
            auto store = RegistryStore::OpenFileStore(storePath_);
            int64_t reads = 0;
            int64_t changes = 0;
            std::pair<int64_t, int64_t> last{0, 0};
            std::string failure;
            for (;;) {
                pollfd stop{stopFd, POLLIN, 0};
                if (::poll(&stop, 1, 0) > 0)
                    break;  // the write end closed: the test is done
                if (std::chrono::steady_clock::now() > deadline) {
                    failure = "never told to stop";
                    break;
                }
                std::optional<std::pair<int64_t, int64_t>> seen;
                if (kind == 0) {
                    const std::string bytes = ReadAllBytes(storePath_);
                    seen = VersionOf(encoding, bytes);
                    if (!seen) {
                        testsupport::WriteFileBytes(resultFile + ".bad", bytes);
                        failure =
                            "a read that is no whole version (bytes in " + resultFile + ".bad)";
                    }
                } else {
                    LibRegistry::KeyHandle key = 0;
                    std::optional<int64_t> a, b;
                    if (store->OpenKey(LibRegistry::kCurrentUser, kCrashKey, LibRegistry::kKeyRead,
                                       key) == 0) {
                        for (const char writer : kWriters) {
                            std::string value(200000, '\0');
                            uint32_t size = static_cast<uint32_t>(value.size());
                            uint32_t type = 0;
                            if (store->QueryValue(key, ValueName(writer), &type,
                                                  reinterpret_cast<uint8_t*>(value.data()),
                                                  &size) == 0 &&
                                size > 0) {
                                value.resize(size - 1);
                                (writer == 'A' ? a : b) = GenerationOf(writer, value);
                            }
                        }
                        store->CloseKey(key);
                    }
                    if (a && b) {
                        seen = std::make_pair(*a, *b);
                    } else {
                        failure = "the store object gave a value that is not whole";
                    }
                }
                if (!failure.empty())
                    break;
                if (seen->first < last.first || seen->second < last.second) {
                    failure = "a read went back from " + std::to_string(last.first) + "," +
                              std::to_string(last.second) + " to " + std::to_string(seen->first) +
                              "," + std::to_string(seen->second);
                    break;
                }
                changes += *seen != last ? 1 : 0;
                last = *seen;
                ++reads;
            }
            testsupport::WriteFileBytes(
                resultFile, failure.empty()
                                ? "ok " + std::to_string(reads) + " " + std::to_string(changes)
                                : failure);
            return failure.empty() ? 0 : 1;
        });
    }

    std::string storeFolder_;
    std::string storePath_;
    testsupport::ScopedStore store_;
};

TEST_P(SettingsStoreCrash, KilledWritersLeaveAWholeStoreAndLoseNoConfirmedChange) {
    int stop[2];
    ASSERT_EQ(::pipe(stop), 0);
    const std::vector<std::string> results = {folder_.File("reader-bytes.txt"),
                                              folder_.File("reader-store.txt")};
    std::vector<pid_t> readers;
    for (int kind = 0; kind < 2; ++kind)
        readers.push_back(StartReader(kind, stop, results[static_cast<std::size_t>(kind)]));
    ::close(stop[0]);

    // How long a writer takes to start and make three writes, here and now (a build with
    // sanitizers, a busy machine): the kills below fall within twice that.
    int64_t confirmed[2] = {0, 0};
    std::chrono::microseconds threeWrites{0};
    {
        int report[2];
        ASSERT_EQ(::pipe(report), 0);
        const auto start = std::chrono::steady_clock::now();
        const pid_t writer = StartWriter('A', report[1], 3);
        ::close(report[1]);
        const int status = WaitFor(writer);
        threeWrites = std::chrono::duration_cast<std::chrono::microseconds>(
            std::chrono::steady_clock::now() - start);
        ASSERT_TRUE(WIFEXITED(status) && WEXITSTATUS(status) == 0);
        confirmed[0] = LastReported(ReadToEnd(report[0]), 0);
        ::close(report[0]);
        ASSERT_EQ(confirmed[0], 3);
    }

    // Rounds of two writers at once, each killed after its own random time: before it
    // started, while it waits for the lock, in the middle of a write or between writes. At
    // least 24 rounds, and more (up to 120) until each writer has finished a write and some
    // kill has landed in the middle of replacing the file: otherwise the test proves nothing.
    std::mt19937 random(20310314);
    std::uniform_int_distribution<int64_t> delay(0, 2 * threeWrites.count());
    int leftBehind = 0;
    const int64_t before[2] = {confirmed[0], confirmed[1]};
    auto enough = [&] {
        return leftBehind > 0 && confirmed[0] > before[0] && confirmed[1] > before[1];
    };
    for (int round = 0; round < 120 && (round < 24 || !enough()); ++round) {
        int reports[2][2];
        pid_t writers[2];
        for (int i = 0; i < 2; ++i) {
            ASSERT_EQ(::pipe(reports[i]), 0);
            writers[i] = StartWriter(kWriters[i], reports[i][1], 1000);
            ::close(reports[i][1]);
        }
        const int64_t first = delay(random);
        const int64_t second = delay(random);
        std::this_thread::sleep_for(std::chrono::microseconds(std::min(first, second)));
        ::kill(writers[first <= second ? 0 : 1], SIGKILL);
        std::this_thread::sleep_for(std::chrono::microseconds(std::abs(first - second)));
        ::kill(writers[first <= second ? 1 : 0], SIGKILL);
        for (int i = 0; i < 2; ++i) {
            const int status = WaitFor(writers[i]);
            EXPECT_TRUE(WIFSIGNALED(status) || (WIFEXITED(status) && WEXITSTATUS(status) == 0))
                << "writer " << kWriters[i] << " in round " << round;
            confirmed[i] = LastReported(ReadToEnd(reports[i][0]), confirmed[i]);
            ::close(reports[i][0]);
        }
        // The store holds every confirmed write, or the one write that succeeded just before
        // its writer died and could not tell.
        const auto version = VersionOf(GetParam(), ReadAllBytes(storePath_));
        ASSERT_TRUE(version) << "round " << round;
        EXPECT_GE(version->first, confirmed[0]) << "round " << round;
        EXPECT_LE(version->first, confirmed[0] + 1) << "round " << round;
        EXPECT_GE(version->second, confirmed[1]) << "round " << round;
        EXPECT_LE(version->second, confirmed[1] + 1) << "round " << round;
        confirmed[0] = version->first;
        confirmed[1] = version->second;
        // A writer killed half way through replacing the file leaves its new copy behind.
        for (const auto& entry : fs::directory_iterator(storeFolder_)) {
            if (entry.path().filename().string().find(".vtrtmp-") != std::string::npos)
                ++leftBehind;
        }
    }
    EXPECT_TRUE(enough()) << "writes finished: " << confirmed[0] - before[0] << " and "
                          << confirmed[1] - before[1] << ", kills in a write: " << leftBehind;

    // Writers that run to the end: their changes land, and nothing of the killed ones stays.
    for (int i = 0; i < 2; ++i) {
        int report[2];
        ASSERT_EQ(::pipe(report), 0);
        const pid_t writer = StartWriter(kWriters[i], report[1], 2);
        ::close(report[1]);
        const int status = WaitFor(writer);
        ASSERT_TRUE(WIFEXITED(status) && WEXITSTATUS(status) == 0) << kWriters[i];
        confirmed[i] = LastReported(ReadToEnd(report[0]), -1);
        ::close(report[0]);
    }
    ::close(stop[1]);
    for (std::size_t i = 0; i < readers.size(); ++i) {
        const int status = WaitFor(readers[i]);
        const std::string outcome = testsupport::ReadFileBytes(results[i]);
        EXPECT_TRUE(WIFEXITED(status) && WEXITSTATUS(status) == 0) << outcome;
        EXPECT_EQ(outcome.rfind("ok ", 0), 0u) << outcome;
        // The reader did read while the writers were at work, and saw the store change.
        long long reads = 0, changes = 0;
        std::sscanf(outcome.c_str(), "ok %lld %lld", &reads, &changes);
        EXPECT_GT(reads, 10) << outcome;
        EXPECT_GT(changes, 1) << outcome;
    }
    const std::string final = testsupport::ReadFileBytes(storePath_);
    EXPECT_EQ(VersionOf(GetParam(), final), std::make_pair(confirmed[0], confirmed[1]));
    EXPECT_TRUE(final == StoreBytes(GetParam(), confirmed[0], confirmed[1]));
    std::vector<std::string> names;
    for (const auto& entry : fs::directory_iterator(storeFolder_))
        names.push_back(entry.path().filename().string());
    EXPECT_EQ(names, std::vector<std::string>{"registry.reg"});
}

INSTANTIATE_TEST_SUITE_P(Encodings, SettingsStoreCrash,
                         ::testing::Values(Encoding::Utf8, Encoding::Utf16),
                         [](const ::testing::TestParamInfo<Encoding>& info) {
                             return info.param == Encoding::Utf8 ? std::string("Utf8")
                                                                 : std::string("Utf16");
                         });

// --- The results report ---------------------------------------------------------------------

constexpr int kReportResults = 1500;

// The report that writer saves at generation n: its results carry the writer and generation
// in their first detail and a line whose length follows from n, so that a report cut short or
// mixed from two saves is told from a whole one. Written out here as the report's format has
// it, not through the writer.
std::string ReportBytes(char writer, int64_t n) {
    const std::string first = std::string("writer ") + writer + " generation " + std::to_string(n);
    const std::string padding(40 + static_cast<std::size_t>(n % 7) * 10,
                              static_cast<char>('a' + n % 26));
    std::string text;
    for (int i = 0; i < kReportResults; ++i) {
        if (i > 0)
            text += std::string(79, '=') + "\r\n";
        text +=
            "Message Number: 5\r\nSeverity: Warning\r\nDescription: Crash report\r\n"
            "Detail #1: " +
            first + "\r\nDetail #2: line " + std::to_string(i) + "\r\nDetail #3: " + padding +
            "\r\n";
    }
    return text;
}

// The writer and generation of a whole report; nothing for anything else.
std::optional<std::pair<char, int64_t>> ReportVersionOf(const std::string& bytes) {
    const std::string marker = "Detail #1: writer ";
    const std::size_t at = bytes.find(marker);
    if (at == std::string::npos || at + marker.size() + 13 > bytes.size())
        return std::nullopt;
    const char writer = bytes[at + marker.size()];
    const std::size_t number = at + marker.size() + std::string("A generation ").size();
    const std::size_t end = bytes.find('\r', number);
    if (end == std::string::npos || end == number || end - number > 9)
        return std::nullopt;
    int64_t n = 0;
    for (std::size_t i = number; i < end; ++i) {
        if (bytes[i] < '0' || bytes[i] > '9')
            return std::nullopt;
        n = n * 10 + (bytes[i] - '0');
    }
    if ((writer != 'A' && writer != 'B') || bytes != ReportBytes(writer, n))
        return std::nullopt;
    return std::make_pair(writer, n);
}

class ResultsReportCrash : public testsupport::StoreTest {
  protected:
    ResultsReportCrash()
        : reportFolder_(folder_.File("reports")), report_(reportFolder_ + "/report.txt") {
        fs::create_directories(reportFolder_);
        testsupport::WriteFileBytes(report_, ReportBytes('A', 0));
    }

    // A writer: saves the report of its generations from `from` on, each through the
    // results report of the driver, and reports each save that succeeded.
    pid_t StartWriter(char writer, int reportFd, int64_t from, int saves) {
        return Spawn([&, writer, reportFd, from, saves] {
            for (int64_t n = from; n < from + saves; ++n) {
                LibVerify::ClearResults();
                const std::string first =
                    std::string("writer ") + writer + " generation " + std::to_string(n);
                const std::string padding(40 + static_cast<std::size_t>(n % 7) * 10,
                                          static_cast<char>('a' + n % 26));
                for (int i = 0; i < kReportResults; ++i) {
                    LibVerify::AddResult(Severity::Warning, "Crash report", 5, 5,
                                         {first, "line " + std::to_string(i), padding});
                }
                ResultsReport::SaveResultsReport(report_);
                WriteLine(reportFd, std::to_string(n));
            }
            return 0;
        });
    }

    // A reader: reads the report afresh until the stop pipe closes; every read must be a
    // whole report. The outcome goes to the result file, as for the store's readers.
    pid_t StartReader(const int stop[2], const std::string& resultFile) {
        const int stopFd = stop[0];
        const int stopWriteFd = stop[1];
        return Spawn([&, stopFd, stopWriteFd, resultFile] {
            ::close(stopWriteFd);
            const auto deadline = std::chrono::steady_clock::now() + std::chrono::minutes(2);
            int64_t reads = 0;
            int64_t changes = 0;
            std::string last;
            std::string failure;
            for (;;) {
                pollfd stopped{stopFd, POLLIN, 0};
                if (::poll(&stopped, 1, 0) > 0)
                    break;
                if (std::chrono::steady_clock::now() > deadline) {
                    failure = "never told to stop";
                    break;
                }
                const std::string bytes = ReadAllBytes(report_);
                if (!ReportVersionOf(bytes)) {
                    testsupport::WriteFileBytes(resultFile + ".bad", bytes);
                    failure = "a read that is no whole report (bytes in " + resultFile + ".bad)";
                    break;
                }
                changes += bytes != last ? 1 : 0;
                last = bytes;
                ++reads;
            }
            testsupport::WriteFileBytes(
                resultFile, failure.empty()
                                ? "ok " + std::to_string(reads) + " " + std::to_string(changes)
                                : failure);
            return failure.empty() ? 0 : 1;
        });
    }

    // The new versions that killed writers left beside the report.
    std::vector<std::string> LeftBehind() const {
        std::vector<std::string> names;
        for (const auto& entry : fs::directory_iterator(reportFolder_)) {
            const std::string name = entry.path().filename().string();
            if (name != "report.txt")
                names.push_back(name);
        }
        return names;
    }

    std::string reportFolder_;
    std::string report_;
};

TEST_F(ResultsReportCrash, KilledWritersLeaveAWholeReportAndTheNextSaveClearsTheirLeftovers) {
    int stop[2];
    ASSERT_EQ(::pipe(stop), 0);
    const std::string result = folder_.File("reader.txt");
    const pid_t reader = StartReader(stop, result);
    ::close(stop[0]);

    // How long a writer takes to start and save three reports, here and now.
    int64_t confirmed[2] = {0, 0};
    std::chrono::microseconds threeSaves{0};
    {
        int report[2];
        ASSERT_EQ(::pipe(report), 0);
        const auto start = std::chrono::steady_clock::now();
        const pid_t writer = StartWriter('A', report[1], 1, 3);
        ::close(report[1]);
        const int status = WaitFor(writer);
        threeSaves = std::chrono::duration_cast<std::chrono::microseconds>(
            std::chrono::steady_clock::now() - start);
        ASSERT_TRUE(WIFEXITED(status) && WEXITSTATUS(status) == 0);
        confirmed[0] = LastReported(ReadToEnd(report[0]), 0);
        ::close(report[0]);
        ASSERT_EQ(confirmed[0], 3);
    }

    // Rounds of two writers at once, each killed after its own random time, until kills have
    // landed in the middle of saves and both writers have finished some.
    std::mt19937 random(20310315);
    std::uniform_int_distribution<int64_t> delay(0, 2 * threeSaves.count());
    int leftBehind = 0;
    const int64_t before[2] = {confirmed[0], confirmed[1]};
    auto enough = [&] {
        return leftBehind > 0 && confirmed[0] > before[0] && confirmed[1] > before[1];
    };
    for (int round = 0; round < 120 && (round < 24 || !enough()); ++round) {
        int reports[2][2];
        pid_t writers[2];
        for (int i = 0; i < 2; ++i) {
            ASSERT_EQ(::pipe(reports[i]), 0);
            writers[i] = StartWriter(kWriters[i], reports[i][1], confirmed[i] + 1, 1000);
            ::close(reports[i][1]);
        }
        const int64_t first = delay(random);
        const int64_t second = delay(random);
        std::this_thread::sleep_for(std::chrono::microseconds(std::min(first, second)));
        ::kill(writers[first <= second ? 0 : 1], SIGKILL);
        std::this_thread::sleep_for(std::chrono::microseconds(std::abs(first - second)));
        ::kill(writers[first <= second ? 1 : 0], SIGKILL);
        for (int i = 0; i < 2; ++i) {
            const int status = WaitFor(writers[i]);
            EXPECT_TRUE(WIFSIGNALED(status) || (WIFEXITED(status) && WEXITSTATUS(status) == 0))
                << "writer " << kWriters[i] << " in round " << round;
            // A save that landed but whose writer died before it could tell is one further.
            confirmed[i] = LastReported(ReadToEnd(reports[i][0]), confirmed[i]);
            ::close(reports[i][0]);
        }
        // The report is one whole save, by one of the writers and not beyond what it did.
        const auto version = ReportVersionOf(ReadAllBytes(report_));
        ASSERT_TRUE(version) << "round " << round;
        const int index = version->first == 'A' ? 0 : 1;
        EXPECT_LE(version->second, confirmed[index] + 1) << "round " << round;
        confirmed[index] = std::max(confirmed[index], version->second);
        leftBehind += static_cast<int>(LeftBehind().size());
    }
    EXPECT_TRUE(enough()) << "saves finished: " << confirmed[0] - before[0] << " and "
                          << confirmed[1] - before[1] << ", kills in a save: " << leftBehind;

    // A save that runs to the end lands, and clears what the killed ones left.
    {
        int report[2];
        ASSERT_EQ(::pipe(report), 0);
        const pid_t writer = StartWriter('B', report[1], confirmed[1] + 1, 1);
        ::close(report[1]);
        const int status = WaitFor(writer);
        ASSERT_TRUE(WIFEXITED(status) && WEXITSTATUS(status) == 0);
        EXPECT_EQ(LastReported(ReadToEnd(report[0]), -1), confirmed[1] + 1);
        ::close(report[0]);
    }
    ::close(stop[1]);
    const int status = WaitFor(reader);
    const std::string outcome = testsupport::ReadFileBytes(result);
    EXPECT_TRUE(WIFEXITED(status) && WEXITSTATUS(status) == 0) << outcome;
    EXPECT_EQ(outcome.rfind("ok ", 0), 0u) << outcome;
    long long reads = 0, changes = 0;
    std::sscanf(outcome.c_str(), "ok %lld %lld", &reads, &changes);
    EXPECT_GT(reads, 10) << outcome;
    EXPECT_GT(changes, 1) << outcome;
    EXPECT_EQ(ReportVersionOf(ReadAllBytes(report_)), std::make_pair('B', confirmed[1] + 1));
    EXPECT_EQ(LeftBehind(), std::vector<std::string>{});
}

#endif  // !_WIN32

// Without any killing: the bytes of a version are recognised, and anything cut from them or
// mixed from two of them is not.
TEST(SettingsStoreVersions, OnlyWholeVersionsAreRecognised) {
    for (const Encoding encoding : {Encoding::Utf8, Encoding::Utf16}) {
        const std::string whole = StoreBytes(encoding, 7, 12);
        ASSERT_EQ(VersionOf(encoding, whole), std::make_pair(int64_t{7}, int64_t{12}));
        EXPECT_FALSE(VersionOf(encoding, whole.substr(0, whole.size() / 2)));
        EXPECT_FALSE(VersionOf(encoding, whole.substr(0, whole.size() - 2)));
        const std::string other = StoreBytes(encoding, 8, 12);
        EXPECT_FALSE(VersionOf(encoding, whole.substr(0, 4096) + other.substr(4096)));
        EXPECT_FALSE(VersionOf(encoding, std::string()));
    }
    EXPECT_EQ(GenerationOf('A', Payload('A', 25)), 25);
    EXPECT_FALSE(GenerationOf('B', Payload('A', 25)));
    EXPECT_FALSE(GenerationOf('A', Payload('A', 25).substr(0, 20000)));
}

}  // namespace
}  // namespace vtr
