// Keeps the HTML parser away from source that nests without end.
#pragma once

#include <string_view>

#include "core/memory/containers.h"

namespace qorvex::dom {

// The parser's work grows with the square of the nesting: 100,000 open elements take it 17 seconds. Counts
// tags without parsing; when more than limits::kMaxSourceNesting elements would be open at once, writes a
// copy in which the tags beyond are blanks, and returns true. Positions stay, text stays, and no more of a
// tree is lost than the builder, whose own limit is far lower, would flatten anyway.
bool FlattenNesting(std::string_view source, TaggedString<MemoryTag::DOM>& rewritten);

}  // namespace qorvex::dom
