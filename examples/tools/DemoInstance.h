#pragma once

#include <functional>
#include <string>

#include "schedule/DateTime.h"

// Turns the demo installation's sources (examples/demo) into a working installation in a
// folder of its own. The sources hold placeholders where an installation needs absolute
// paths or dates:
//   @DEMO@              the folder of the instance (absolute, no trailing separator; on
//                       Windows the "/"-separated path after it takes "\" instead);
//   @DATE+N@            the date N days after the day of instantiation, "yyyy-mm-dd";
//   @WEEKTIME+N H:MM@   that date's weekday at H:MM, as a week time (seconds since Sunday
//                       00:00:00), for the calendar schedule's events.
// What replaces @DEMO@ is escaped as the file's format needs: registry strings in .reg
// files, the list notation in .lss, .lsc and .map files, XML in sequence and edit files.
// A source named "X.compressed" becomes X, gzip-compressed. app-versions.txt is not copied:
// the application folder "app" is filled with every file of the suite's application list,
// each with the version the verifier expects except where app-versions.txt names another.
namespace vtr::demo {

// Writes one application file with the given version ("" for none).
using AppFileWriter = std::function<void(const std::string& path, const std::string& version)>;

struct InstanceOptions {
    DateTime today;  // the day of instantiation
    AppFileWriter writeAppFile;
};

// Makes the instance. The target folder is created; an earlier instance in it (recognised by
// its ".vantori-demo" marker) is removed first, and any other non-empty folder is refused.
// Throws std::runtime_error with a message naming the file on any failure.
void Instantiate(const std::string& sourceFolder, const std::string& targetFolder,
                 const InstanceOptions& options);

// How a placeholder's replacement is escaped in a file.
enum class FileKind { Plain, Registry, ListNotation, Xml };
FileKind KindOf(const std::string& fileName);

// The text with every placeholder replaced; throws std::runtime_error for an unknown or
// malformed placeholder.
std::string Substitute(const std::string& text, FileKind kind, const std::string& demoFolder,
                       const DateTime& today);

// The name of the marker file that every instance holds.
inline constexpr const char* kMarkerFile = ".vantori-demo";

}  // namespace vtr::demo
