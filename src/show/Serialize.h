#pragma once

#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

// The one text notation in which the suite stores its records: "(" items separated by ","
// ")", where an item is an escaped plain value or itself a list, nested to any depth.
// Reserved characters in plain values are written "*E" (*), "*O" ((), "*C" ()), "*S" (,).
//
// Every function here is a pure function of its text; readers raise vtr::VtrError.
namespace vtr::Serialize {

// The items of one list level, indexed from the lower bound the reader was given: a
// record read with lower bound 1 has its field n at index n.
class List {
  public:
    List() = default;
    List(std::vector<std::string> items, int32_t lowerBound);

    int32_t LowerBound() const noexcept { return lowerBound_; }
    // LowerBound() + Count() - 1 (one below the lower bound when the list is empty).
    int32_t UpperBound() const noexcept;
    int32_t Count() const noexcept { return static_cast<int32_t>(items_.size()); }
    bool Empty() const noexcept { return items_.empty(); }
    // True when index lies within LowerBound() .. UpperBound().
    bool Has(int32_t index) const noexcept;

    // The item at index; an index outside the bounds raises error 9 (subscript out of range).
    const std::string& operator[](int32_t index) const;

    const std::vector<std::string>& Items() const& noexcept { return items_; }
    std::vector<std::string> Items() && noexcept { return std::move(items_); }
    std::vector<std::string>::const_iterator begin() const noexcept { return items_.begin(); }
    std::vector<std::string>::const_iterator end() const noexcept { return items_.end(); }

  private:
    std::vector<std::string> items_;
    int32_t lowerBound_ = 0;
};

// Reads one list level. Text before the first "(" and after the last ")" is ignored; a text
// without parentheses is an empty list. Items are returned exactly as they stand between the
// separators of depth 0 (not unescaped, not trimmed); a nested list stays one item, with its
// parentheses. Raises, with source "Serialize.ListFromText":
//   1 "Badly formatted list, enclosing parens"       only one of "(" / ")", or ")" before "("
//   2 "Badly formatted list, missing closing paren"  a "(" at depth 0 never closes
//   3 "Badly formatted list, unexpected closing paren" a ")" at depth 0 before the next "("
//   4 "Badly formatted list, missing closing paren"  a nested list runs out of ")"
// Runs in time linear in the text, whatever its nesting.
List ListFromText(std::string_view text, int32_t lowerBound);

// "(" + the items joined with "," + ")"; items are written as given (escape plain values
// first). No items give "()".
std::string ListToText(const std::vector<std::string>& items);

std::string EscapeText(std::string_view text);
std::string UnescapeText(std::string_view text);

// Signed-blank decimal: " 0", " 2", "-1".
std::string LongToText(int32_t value);
// The number of the unescaped text (blanks around it allowed), rounded down. Anything that
// is not a number, the empty text included, raises error 13 (type mismatch); a result
// outside the 32-bit range raises error 6 (overflow).
int32_t TextToLong(std::string_view text);

std::string BoolToText(bool value);
// True exactly when the unescaped text, upper-cased, is "T".
bool TextToBool(std::string_view text);

// The strict string-to-number conversion behind TextToLong: optional blanks, an optional
// sign, decimal digits with an optional fraction and exponent, optional blanks. Raises
// error 13 on anything else and error 6 when the value is out of the floating-point range.
double TextToNumber(std::string_view text, const char* source = "Serialize.TextToNumber");

// The lenient conversion used for stored record numbers: leading blanks are skipped and
// reading stops at the first character that cannot continue a number; no number gives 0.
double LeadingNumber(std::string_view text);

// Rounds to the nearest whole number, halves to the even neighbour; a result outside the
// 32-bit range raises error 6 (overflow).
int32_t RoundToLong(double value, const char* source = "Serialize.RoundToLong");

}  // namespace vtr::Serialize
