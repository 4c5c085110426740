#pragma once

#include <cstdint>
#include <string>
#include <vector>

namespace vtr::testsupport {

// What the list notation's defining algorithm makes of a text.
struct LiteralReading {
    enum class Kind { Items, Error, Endless };
    Kind kind = Kind::Items;
    std::vector<std::string> items;  // for Items
    int32_t error = 0;               // for Error: 1 to 4
};

// The list reader exactly as the notation defines it, step by step, on 1-based positions:
// every round searches the remaining text again and every item cut copies the rest. It is
// quadratic and only the yardstick that the linear reader is measured against. A state met
// again without an item taken means the defined algorithm would never finish (Endless).
LiteralReading ReadListLiterally(const std::string& text);

}  // namespace vtr::testsupport
