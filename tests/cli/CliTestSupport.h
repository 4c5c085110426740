#pragma once

#include <sstream>
#include <string>
#include <vector>

#include "App.h"
#include "CommandLine.h"

// Runs the command-line verifier in the test's own process.
namespace vtr::cli::testing {

// argv for the arguments, with the program's name in front.
class Arguments {
  public:
    explicit Arguments(std::vector<std::string> arguments) : strings_(std::move(arguments)) {
        strings_.insert(strings_.begin(), "vantori-verify");
        for (const std::string& s : strings_)
            pointers_.push_back(s.c_str());
        pointers_.push_back(nullptr);
    }
    int Count() const { return static_cast<int>(strings_.size()); }
    const char* const* Values() const { return pointers_.data(); }

  private:
    std::vector<std::string> strings_;
    std::vector<const char*> pointers_;
};

// What one run printed and returned.
struct Outcome {
    int status = -1;
    std::string out;
    std::string err;
};

inline Outcome RunMain(const std::vector<std::string>& arguments, bool terminal = false,
                       int columns = 80, ProgressLine::Clock clock = {}) {
    std::ostringstream out;
    std::ostringstream err;
    Console console{out, err, terminal, columns, std::move(clock)};
    const Arguments argv(arguments);
    Outcome outcome;
    outcome.status = Main(argv.Count(), argv.Values(), console);
    outcome.out = out.str();
    outcome.err = err.str();
    return outcome;
}

inline ParseOutcome Parse(const std::vector<std::string>& arguments, std::string* out = nullptr,
                          std::string* err = nullptr) {
    std::ostringstream outStream;
    std::ostringstream errStream;
    const Arguments argv(arguments);
    ParseOutcome outcome = ParseCommandLine(argv.Count(), argv.Values(), outStream, errStream);
    if (out != nullptr)
        *out = outStream.str();
    if (err != nullptr)
        *err = errStream.str();
    return outcome;
}

}  // namespace vtr::cli::testing
