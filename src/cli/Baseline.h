#pragma once

#include <string>
#include <unordered_set>

#include "ResultsOutput.h"

// A baseline for nightly checks: the keys of the results of one run, kept in a file of the
// user's choosing, so that later runs list only what is new. It is never written into the
// suite's ignore lists.
//
// The file is a JSON object:
//   {"vantoriVerifyBaseline": 1, "program": "vantori-verify 1.2.0",
//    "target": {"kind": "schedule"}, "keys": ["43-[SHOW]: ... / ", ...]}
// with each key in the text form of IgnoreKeyText, so that any bytes survive.
namespace vtr::cli {

class Baseline {
  public:
    // Reads a baseline file. Raises a VtrError whose description names the file and what is
    // wrong: that it does not exist (and how to make one), cannot be read, or is not a
    // baseline.
    static Baseline Read(const std::string& path);

    // The file's text for the results of a run (every result, ignored ones too).
    static std::string TextOf(const RunRecord& record);

    // Marks each result of the record whose key is in the baseline; returns how many.
    std::size_t Mark(RunRecord& record) const;

    std::size_t Size() const { return keys_.size(); }

  private:
    std::unordered_set<std::string> keys_;
};

}  // namespace vtr::cli
