#include "environment/OutputFile.h"

#include <filesystem>
#include <system_error>

#include "engine/VtrError.h"
#include "environment/AtomicFile.h"
#include "environment/FilesRead.h"

namespace vtr::OutputFile {
namespace {

// The two paths are one name, once made absolute and rid of "." and "..".
bool SameName(const std::string& a, const std::string& b) {
    std::error_code error;
    const std::filesystem::path first = std::filesystem::absolute(a, error).lexically_normal();
    const std::filesystem::path second = std::filesystem::absolute(b, error).lexically_normal();
    return a == b || (!error && first == second);
}

}  // namespace

void RefuseInput(const std::string& path, const std::string& what, const std::string& source) {
    const std::optional<FilesRead::Found> found = FilesRead::FileNamedBy(path);
    if (!found)
        return;
    const char* used = found->use == FilesRead::Use::Read ? "read" : "checked";
    const std::string which = SameName(found->file, path)
                                  ? std::string("this verification ") + used + " that file"
                                  : "that is " + found->file + ", which this verification " + used;
    Raise(ErrorNumbers::UserMessage, source,
          "Cannot save the " + what + " as " + path + ": " + which +
              "; the verifier never changes the files it verifies. Choose another file.");
}

void Write(const std::string& path, const std::string& bytes, const std::string& what,
           const std::string& source) {
    RefuseInput(path, what, source);
    AtomicFile::Write(path, bytes, what, source);
}

}  // namespace vtr::OutputFile
