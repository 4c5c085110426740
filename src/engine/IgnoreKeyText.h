#pragma once

#include <cstddef>
#include <optional>
#include <string>
#include <string_view>

// An ignore key as text that any channel carries unchanged: JSON (which holds UTF-8 only), a
// terminal, a command line, a baseline file.
//
// A key is the result's bytes: its message number, "-", then each detail followed by " / ".
// Paths that are not UTF-8 (a name written in another code page) make keys that are not
// UTF-8 either. Such a key, or one holding a control character, is written in the escaped
// form: "escaped:" then the key with each backslash doubled, each byte that is no UTF-8
// character or that is a control character written "\xHH" (two hexadecimal digits), and
// every other character as it is. A show named "Café.lss" in Latin-1 (the é is the one byte
// E9) under the folder C:\Shows gives the key text (its last character, a blank, cannot be seen
// here)
//
//   escaped:21-C:\\Shows\\Caf\xE9.lss /
//
// A real key always begins with its message number, so no key is mistaken for an escaped
// text; any other key is its own text, unchanged (Windows paths keep their single
// backslashes).
namespace vtr::IgnoreKeyText {

inline constexpr std::string_view kEscapedMarker = "escaped:";

// The text of a key.
std::string Encode(std::string_view key);

// The key of a text: an escaped text decoded, any other text as it is. Nothing for an escaped
// text with a backslash that begins neither "\\" nor "\x" and two hexadecimal digits.
std::optional<std::string> Decode(std::string_view text);

// True when the bytes are UTF-8: no stray continuation byte, no overlong form, no surrogate,
// nothing above U+10FFFF.
bool IsUtf8(std::string_view bytes);

// The length of the well-formed UTF-8 character at the start of the bytes (1 to 4), or 0 when
// they do not begin with one or are empty.
std::size_t CharacterLength(std::string_view bytes);

}  // namespace vtr::IgnoreKeyText
