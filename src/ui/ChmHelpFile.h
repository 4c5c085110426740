#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

struct chmFile;

namespace vtr {

// A compiled help file, read through the CHM library: its pages, the context map that turns
// a result's help-context id into a page, and the few system entries the viewer shows.
//
// Page paths are the archive's own: "/" followed by the path inside the help file
// ("/Verifier.htm", "/images/note.png"). Lookups ignore letter case, as the archive does.
class ChmHelpFile {
  public:
    // Opens the file; raises VtrError ("Cannot open the help file ...") when it is missing
    // or is not a compiled help file.
    explicit ChmHelpFile(const std::string& path);
    ~ChmHelpFile();
    ChmHelpFile(const ChmHelpFile&) = delete;
    ChmHelpFile& operator=(const ChmHelpFile&) = delete;

    const std::string& Path() const { return path_; }

    // The archive path of a page ("Verifier.htm", "/Verifier.htm", "a\\b.htm" all name
    // "/..."); nothing when the file holds no such page. An "#anchor" is not part of it.
    std::optional<std::string> FindPage(const std::string& page) const;
    // The bytes of a page; nothing when it is not in the file or cannot be read.
    std::optional<std::string> ReadPage(const std::string& page) const;
    // Every file of the archive that is a page or picture (no internal tables, no folders).
    std::vector<std::string> Pages() const;

    // The page the context map gives for a help-context id (archive path, with any
    // "#anchor" of the map entry kept); nothing when the map has no such id or no map.
    std::optional<std::string> PageForContext(int32_t contextId) const;

    // The entries of the file's system table: its title and default topic ("" when absent).
    const std::string& Title() const { return title_; }
    const std::string& DefaultTopic() const { return defaultTopic_; }

    // The most bytes read for one page or table; anything larger is treated as unreadable.
    static constexpr uint64_t kMaxObjectSize = 64ull * 1024 * 1024;

  private:
    std::optional<std::string> ReadObject(const std::string& archivePath) const;
    std::optional<std::string> ResolveMapTarget(std::string target) const;
    void ReadSystemTable();

    std::string path_;
    chmFile* handle_ = nullptr;
    std::string title_;
    std::string defaultTopic_;
};

}  // namespace vtr
