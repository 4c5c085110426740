#pragma once

#include <cstdint>
#include <exception>
#include <string>

namespace vtr {

// Keeps the error being handled so that clean-up can run before it is raised again:
//
//   catch (...) {
//       SavedErr saved;          // the error as it stands
//       CloseRegistryKey(key);   // may fail itself; that error is not the one reported
//       saved.Raise();           // the caller sees the first error
//   }
//
// Created inside a catch block it copies the error's description, help context, help file,
// number and source. An exception that is not a VtrError is kept as it is and rethrown
// unchanged.
class SavedErr {
  public:
    SavedErr();

    const std::string& Description() const { return description_; }
    int32_t HelpContext() const { return helpContext_; }
    const std::string& HelpFile() const { return helpFile_; }
    int32_t Number() const { return number_; }
    const std::string& Source() const { return source_; }

    // Raises the saved error again with exactly the saved values.
    [[noreturn]] void Raise() const;

  private:
    std::string description_;
    int32_t helpContext_ = 0;
    std::string helpFile_;
    int32_t number_ = 0;
    std::string source_;
    std::exception_ptr other_;  // set when the error was not a VtrError
};

}  // namespace vtr
