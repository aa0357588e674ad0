#include "dom/open_formatting.h"

#include <functional>
#include <string_view>

#include "core/limits.h"

namespace qorvex::dom {

using css::TagId;

namespace {

bool IsFormatting(TagId tag) {
    switch (tag) {
        case TagId::A:
        case TagId::B:
        case TagId::Big:
        case TagId::Code:
        case TagId::Em:
        case TagId::Font:
        case TagId::I:
        case TagId::Nobr:
        case TagId::S:
        case TagId::Small:
        case TagId::Strike:
        case TagId::Strong:
        case TagId::Tt:
        case TagId::U:
            return true;
        default:
            return false;
    }
}

// The parser closes the one that is open when the next starts.
bool IsAlone(TagId tag) {
    return tag == TagId::A || tag == TagId::Nobr;
}

// Equal elements that stay in the list, the "Noah's Ark clause".
constexpr size_t kMostEqual = 3;

}  // namespace

bool OpenFormatting::TakeStart(TagId tag, std::string_view attributes) {
    if (IsFormatting(tag)) Open(tag, attributes);
    // A table's cell has a list of its own, which goes with it: unclosed formatting stays in the cell.
    if (tag == TagId::Td || tag == TagId::Th) open_.clear();
    return Spend();
}

bool OpenFormatting::TakeEnd(TagId tag) {
    if (IsFormatting(tag)) Close(tag);
    return Spend();
}

// Whatever the tag is, it may end a block or start one. The searches below are paid from the same purse.
bool OpenFormatting::Spend() {
    reopened_ += open_.size();
    return reopened_ <= limits::kReopenedAtLeast + ++tags_ * limits::kReopenedPerTag;
}

void OpenFormatting::Open(TagId tag, std::string_view attributes) {
    if (IsAlone(tag)) Close(tag);
    const Element added{tag, std::hash<std::string_view>()(attributes)};
    size_t equal = 0;
    for (const Element& other : open_)
        equal += other.tag == tag && other.attributes == added.attributes;
    if (equal < kMostEqual) open_.push_back(added);
}

void OpenFormatting::Close(TagId tag) {
    for (uint32_t i = open_.size(); i-- > 0;) {
        if (open_[i].tag != tag) continue;
        open_.erase(open_.begin() + i);
        return;
    }
}

}  // namespace qorvex::dom
