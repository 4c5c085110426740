#include "support/LiteralListReader.h"

#include <set>
#include <utility>

namespace vtr::testsupport {
namespace {

// The first position (from 1) of ch at or after position from; 0 when there is none.
std::size_t Find(const std::string& s, char ch, std::size_t from) {
    if (from < 1 || from > s.size())
        return 0;
    const auto at = s.find(ch, from - 1);
    return at == std::string::npos ? 0 : at + 1;
}

LiteralReading Failed(int32_t number) {
    return {LiteralReading::Kind::Error, {}, number};
}

}  // namespace

LiteralReading ReadListLiterally(const std::string& text) {
    const std::size_t open = Find(text, '(', 1);
    const auto last = text.rfind(')');
    const std::size_t close = last == std::string::npos ? 0 : last + 1;
    if (open == 0 && close == 0)
        return {};
    if (open == 0 || close == 0 || open >= close)
        return Failed(1);
    std::string inner = text.substr(open, close - open - 1);
    long depth = 0;
    std::size_t start = 1;
    std::vector<std::string> items;
    std::size_t p = Find(inner, '(', 1), c = Find(inner, ')', 1), k = Find(inner, ',', 1);
    // Between two items taken, the state is the start and the depth.
    std::set<std::pair<std::size_t, long>> seen;
    for (;;) {
        if (k < 1 && depth < 1)
            break;
        if (!seen.insert({start, depth}).second)
            return {LiteralReading::Kind::Endless, {}, 0};
        bool takeItem = false;
        if (depth != 0) {
            if (c == 0)
                return Failed(4);
            if (p < 1 || p >= c) {
                start = c + 1;
                --depth;
            } else {
                start = p + 1;
                ++depth;
            }
        } else if (c >= p && (p != 0 || c != 0)) {
            if (k >= p) {
                depth = 1;
                start = p + 1;
            } else {
                takeItem = true;
            }
        } else if (c >= p) {
            takeItem = true;
        } else if (c != 0) {
            return Failed(3);
        } else {
            return Failed(2);
        }
        if (takeItem) {
            items.push_back(inner.substr(0, k - 1));
            inner = inner.substr(k);
            start = 1;
            seen.clear();
        }
        p = Find(inner, '(', start);
        c = Find(inner, ')', start);
        k = Find(inner, ',', start);
    }
    items.push_back(inner);
    return {LiteralReading::Kind::Items, std::move(items), 0};
}

}  // namespace vtr::testsupport
