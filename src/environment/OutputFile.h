#pragma once

#include <string>

// The files the program writes for the user (the results report, and the other reports and
// files named on the command line): never one that the verification read or checked, and
// always whole.
namespace vtr::OutputFile {

// Raises error 37 when the path names a file that the current (or last) verification read or
// checked, whatever path names it (see FilesRead), with a description that names the file:
//   "Cannot save the <what> as <path>: that is <file>, which this verification read; the
//    verifier never changes the files it verifies. Choose another file."
void RefuseInput(const std::string& path, const std::string& what, const std::string& source);

// RefuseInput, then AtomicFile::Write: the file is replaced whole or not at all.
void Write(const std::string& path, const std::string& bytes, const std::string& what,
           const std::string& source);

}  // namespace vtr::OutputFile
