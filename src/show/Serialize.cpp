#include "show/Serialize.h"

#include <algorithm>
#include <charconv>
#include <cmath>
#include <limits>

#include "engine/VtrError.h"
#include "show/ModelErrors.h"

namespace vtr::Serialize {

namespace {

constexpr const char* kListSource = "Serialize.ListFromText";
constexpr std::string_view::size_type npos = std::string_view::npos;

[[noreturn]] void RaiseList(int32_t number) {
    switch (number) {
        case 1:
            Raise(1, kListSource, "Badly formatted list, enclosing parens");
        case 3:
            Raise(3, kListSource, "Badly formatted list, unexpected closing paren");
        default:
            Raise(number, kListSource, "Badly formatted list, missing closing paren");
    }
}

// The next position of one character at or after a position. The reader only ever asks for
// positions that do not move backwards, so every character is looked at once at most.
class NextOf {
  public:
    NextOf(std::string_view text, char ch) : text_(text), ch_(ch) {}

    std::string_view::size_type From(std::string_view::size_type pos) {
        if (exhausted_) {
            return npos;
        }
        if (!known_ || found_ < pos) {
            found_ = text_.find(ch_, pos);
            known_ = true;
            if (found_ == npos) {
                exhausted_ = true;
            }
        }
        return found_;
    }

  private:
    std::string_view text_;
    char ch_;
    std::string_view::size_type found_ = 0;
    bool known_ = false;
    bool exhausted_ = false;
};

// Walks a nested list that opened just before pos; returns the position after the ")" that
// closes it. Running out of ")" raises error 4.
std::string_view::size_type SkipNested(std::string_view inner, std::string_view::size_type pos) {
    std::size_t depth = 1;
    for (;;) {
        pos = inner.find_first_of("()", pos);
        if (pos == npos) {
            RaiseList(4);
        }
        if (inner[pos] == '(') {
            ++depth;
        } else if (--depth == 0) {
            return pos + 1;
        }
        ++pos;
    }
}

bool IsBlank(char ch) {
    return ch == ' ' || ch == '\t';
}
bool IsDigit(char ch) {
    return ch >= '0' && ch <= '9';
}

// Length of the longest prefix of text that reads as a decimal number (sign, digits,
// fraction, exponent); 0 when there is none. digits tells whether a digit was seen.
std::size_t NumberPrefix(std::string_view text, bool& digits) {
    std::size_t i = 0;
    digits = false;
    if (i < text.size() && (text[i] == '+' || text[i] == '-')) {
        ++i;
    }
    while (i < text.size() && IsDigit(text[i])) {
        ++i;
        digits = true;
    }
    if (i < text.size() && text[i] == '.') {
        ++i;
        while (i < text.size() && IsDigit(text[i])) {
            ++i;
            digits = true;
        }
    }
    if (!digits) {
        return 0;
    }
    if (i < text.size() && (text[i] == 'e' || text[i] == 'E')) {
        std::size_t j = i + 1;
        if (j < text.size() && (text[j] == '+' || text[j] == '-')) {
            ++j;
        }
        if (j < text.size() && IsDigit(text[j])) {
            while (j < text.size() && IsDigit(text[j])) {
                ++j;
            }
            i = j;
        }
    }
    return i;
}

// The decimal exponent of the first significant digit of a validated number prefix
// (unsigned): "1500" gives 3, "0.01" gives -2, "2e400" gives 400.
long SignificantExponent(std::string_view number) {
    long magnitude = 0;
    std::size_t i = 0;
    long integerDigits = 0;
    bool significant = false;
    while (i < number.size() && IsDigit(number[i])) {
        if (number[i] != '0' || significant) {
            significant = true;
            ++integerDigits;
        }
        ++i;
    }
    if (significant) {
        magnitude = integerDigits - 1;
    } else {
        long zeros = 0;
        if (i < number.size() && number[i] == '.') {
            ++i;
            while (i < number.size() && number[i] == '0') {
                ++zeros;
                ++i;
            }
        }
        magnitude = -(zeros + 1);
    }
    const auto e = number.find_first_of("eE");
    if (e != npos) {
        std::string_view exponent = number.substr(e + 1);
        const bool negative = !exponent.empty() && exponent.front() == '-';
        if (!exponent.empty() && (exponent.front() == '+' || exponent.front() == '-')) {
            exponent.remove_prefix(1);
        }
        long value = 0;
        for (char ch : exponent) {
            value = std::min<long>(value * 10 + (ch - '0'), 100000);
        }
        magnitude += negative ? -value : value;
    }
    return magnitude;
}

// Converts a validated number prefix. A value too large for a double sets outOfRange; one
// too small to represent reads as zero.
double ConvertNumber(std::string_view number, bool& outOfRange) {
    outOfRange = false;
    bool negative = false;
    if (!number.empty() && (number.front() == '+' || number.front() == '-')) {
        negative = number.front() == '-';
        number.remove_prefix(1);
    }
    double value = 0;
    const auto result = std::from_chars(number.data(), number.data() + number.size(), value);
    if (result.ec == std::errc::result_out_of_range) {
        outOfRange = SignificantExponent(number) > 0;
        value = outOfRange ? std::numeric_limits<double>::infinity() : 0.0;
    }
    return negative ? -value : value;
}

}  // namespace

List::List(std::vector<std::string> items, int32_t lowerBound)
    : items_(std::move(items)), lowerBound_(lowerBound) {}

int32_t List::UpperBound() const noexcept {
    return static_cast<int32_t>(static_cast<int64_t>(lowerBound_) + Count() - 1);
}

bool List::Has(int32_t index) const noexcept {
    const int64_t offset = static_cast<int64_t>(index) - lowerBound_;
    return offset >= 0 && offset < static_cast<int64_t>(items_.size());
}

const std::string& List::operator[](int32_t index) const {
    if (!Has(index)) {
        ModelErrors::SubscriptOutOfRange("Serialize.List");
    }
    return items_[static_cast<std::size_t>(static_cast<int64_t>(index) - lowerBound_)];
}

List ListFromText(std::string_view text, int32_t lowerBound) {
    const auto open = text.find('(');
    const auto close = text.rfind(')');
    if (open == npos && close == npos) {
        return List({}, lowerBound);
    }
    if (open == npos || close == npos || close < open) {
        RaiseList(1);
    }
    const std::string_view inner = text.substr(open + 1, close - open - 1);

    // Items are cut at the commas of depth 0. An item always runs from its own beginning
    // (base), so a nested list passed over stays inside it whole.
    std::vector<std::string> items;
    NextOf opens(inner, '('), closes(inner, ')'), commas(inner, ',');
    std::string_view::size_type base = 0;
    std::string_view::size_type pos = 0;
    auto take = [&](std::string_view::size_type comma) {
        items.emplace_back(inner.substr(base, comma - base));
        base = pos = comma + 1;
    };
    for (;;) {
        const auto k = commas.From(pos);
        if (k == npos) {
            break;  // no separator left: the rest is the last item
        }
        const auto p = opens.From(pos);
        const auto c = closes.From(pos);
        if (p == npos && c == npos) {
            take(k);
        } else if (p != npos && c == npos) {
            RaiseList(2);
        } else if (p != npos && c < p) {
            RaiseList(3);
        } else if (p != npos) {
            if (k < p) {
                take(k);
            } else {
                pos = SkipNested(inner, p + 1);
            }
        } else {
            // A stray ")" at depth 0 with no "(" anywhere after it: it closes a level that
            // it opened itself and stays in the item text.
            pos = c + 1;
            const auto next = commas.From(pos);
            if (next == npos) {
                break;
            }
            // A second stray ")" before a later separator leaves the item without any
            // reading at all; it is refused like any other unexpected ")".
            if (closes.From(pos) != npos) {
                RaiseList(3);
            }
            take(next);
        }
    }
    items.emplace_back(inner.substr(base));
    return List(std::move(items), lowerBound);
}

std::string ListToText(const std::vector<std::string>& items) {
    std::size_t size = 2 + (items.empty() ? 0 : items.size() - 1);
    for (const auto& item : items) {
        size += item.size();
    }
    std::string text;
    text.reserve(size);
    text += '(';
    for (std::size_t i = 0; i < items.size(); ++i) {
        if (i != 0) {
            text += ',';
        }
        text += items[i];
    }
    text += ')';
    return text;
}

std::string EscapeText(std::string_view text) {
    std::string out;
    out.reserve(text.size());
    for (char ch : text) {
        switch (ch) {
            case '*':
                out += "*E";
                break;
            case '(':
                out += "*O";
                break;
            case ')':
                out += "*C";
                break;
            case ',':
                out += "*S";
                break;
            default:
                out += ch;
        }
    }
    return out;
}

std::string UnescapeText(std::string_view text) {
    // Every "*" followed by S, C, O or E is one escape, and escapes cannot overlap, so one
    // pass gives what the four whole-text replacements (escape character last) give.
    std::string out;
    out.reserve(text.size());
    for (std::size_t i = 0; i < text.size(); ++i) {
        if (text[i] == '*' && i + 1 < text.size()) {
            const char next = text[i + 1];
            char replacement = 0;
            switch (next) {
                case 'S':
                    replacement = ',';
                    break;
                case 'C':
                    replacement = ')';
                    break;
                case 'O':
                    replacement = '(';
                    break;
                case 'E':
                    replacement = '*';
                    break;
                default:
                    break;
            }
            if (replacement != 0) {
                out += replacement;
                ++i;
                continue;
            }
        }
        out += text[i];
    }
    return out;
}

std::string LongToText(int32_t value) {
    return value < 0 ? std::to_string(value) : " " + std::to_string(value);
}

double TextToNumber(std::string_view text, const char* source) {
    std::size_t begin = 0;
    std::size_t end = text.size();
    while (begin < end && IsBlank(text[begin])) {
        ++begin;
    }
    while (end > begin && IsBlank(text[end - 1])) {
        --end;
    }
    const std::string_view number = text.substr(begin, end - begin);
    bool digits = false;
    if (number.empty() || NumberPrefix(number, digits) != number.size() || !digits) {
        ModelErrors::TypeMismatch(source);
    }
    bool outOfRange = false;
    const double value = ConvertNumber(number, outOfRange);
    if (outOfRange) {
        ModelErrors::Overflow(source);
    }
    return value;
}

int32_t TextToLong(std::string_view text) {
    const double value = std::floor(TextToNumber(UnescapeText(text), "Serialize.TextToLong"));
    if (!(value >= std::numeric_limits<int32_t>::min() &&
          value <= std::numeric_limits<int32_t>::max())) {
        ModelErrors::Overflow("Serialize.TextToLong");
    }
    return static_cast<int32_t>(value);
}

double LeadingNumber(std::string_view text) {
    std::size_t begin = 0;
    while (begin < text.size() &&
           (IsBlank(text[begin]) || text[begin] == '\r' || text[begin] == '\n')) {
        ++begin;
    }
    text.remove_prefix(begin);
    bool digits = false;
    const std::size_t length = NumberPrefix(text, digits);
    if (length == 0) {
        return 0;
    }
    bool outOfRange = false;
    return ConvertNumber(text.substr(0, length), outOfRange);
}

int32_t RoundToLong(double value, const char* source) {
    const double rounded = std::nearbyint(value);  // the default mode rounds halves to even
    if (!(rounded >= std::numeric_limits<int32_t>::min() &&
          rounded <= std::numeric_limits<int32_t>::max())) {
        ModelErrors::Overflow(source);
    }
    return static_cast<int32_t>(rounded);
}

std::string BoolToText(bool value) {
    return value ? "T" : "F";
}

bool TextToBool(std::string_view text) {
    const std::string plain = UnescapeText(text);
    return plain.size() == 1 && (plain[0] == 'T' || plain[0] == 't');
}

}  // namespace vtr::Serialize
