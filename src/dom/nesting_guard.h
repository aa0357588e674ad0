// Keeps source that nests without end, or piles up attributes or unclosed formatting, away from the HTML
// parser.
#pragma once

#include <string_view>

#include "core/memory/containers.h"

namespace qorvex::dom {

struct TamedSource {
    bool nesting = false;     // tags were left out
    bool attributes = false;  // attributes were left out
    bool formatting = false;  // all tags behind some place were left out

    bool IsRewritten() const { return nesting || attributes || formatting; }
};

// The parser's work grows with the square of the nesting and of the attributes of a tag: 100,000 open
// elements take it 17 seconds, 100,000 attributes 25. Counts both without parsing; when more than
// limits::kMaxSourceNesting elements would be open at once, or a tag has more than
// limits::kMaxSourceAttributes attributes, or unclosed formatting would be opened again too often, writes a
// copy in which what lies beyond is blanks. Positions stay, text stays, and no more of a tree is lost than
// the builder, whose own limit is far lower, would flatten anyway.
[[nodiscard]] TamedSource TameSource(std::string_view source, TaggedString<MemoryTag::DOM>& rewritten);

}  // namespace qorvex::dom
