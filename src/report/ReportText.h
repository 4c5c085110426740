#pragma once

#include <string>
#include <string_view>

// Text of the suite's files as the shared reports carry it. The suite's files are bytes: UTF-8
// in practice on Linux, the ANSI code page on Windows. The HTML and SARIF reports are UTF-8
// documents, so every text that came from the user's files passes through here on its way in.
namespace vtr::report {

// The bytes as UTF-8: on Windows converted from the ANSI code page; elsewhere taken as UTF-8,
// with each byte that does not belong to a well-formed UTF-8 sequence replaced by U+FFFD.
std::string DisplayText(std::string_view bytes);

// UTF-8 as it is, each ill-formed byte replaced by U+FFFD (overlong forms, surrogates and
// code points above U+10FFFF are ill-formed).
std::string ValidUtf8(std::string_view bytes);

// DisplayText with &, <, >, " and ' written as character references: safe in an element's
// content and in a quoted attribute value.
std::string Html(std::string_view bytes);

// Text the program writes itself, UTF-8 on every system (times with their dashes, counts),
// with the same five characters written as character references. Text of the suite's files
// goes through Html instead, which converts it from the ANSI code page on Windows.
std::string OwnHtml(std::string_view utf8);

// A file URI for a path, absolute or not as given:
//   /home/ann/Shows/Evening.lss   file:///home/ann/Shows/Evening.lss
//   C:\Shows\Evening.lss           file:///C:/Shows/Evening.lss
//   \\server\share\Evening.lss     file://server/share/Evening.lss
// Backslashes count as separators only in a path that begins with a drive letter or two
// backslashes. Each byte of the name (after DisplayText on Windows, so that the URI is
// UTF-8 there too) but the unreserved characters and "/" is percent-encoded; a byte that is
// not UTF-8 on Linux stays the byte the file system holds, as %XX. A relative path gives a
// relative reference (no scheme), percent-encoded the same way.
std::string FileUri(std::string_view path);

}  // namespace vtr::report
