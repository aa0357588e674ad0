// Counts the elements that an HTML parser opens again where a block ends with formatting elements unclosed.
#pragma once

#include "core/memory/containers.h"
#include "css/values/html_tags.h"

namespace qorvex::dom {

// An unclosed <b> is opened anew in every paragraph that follows (HTML standard, 13.2.4.3 "The list of active
// formatting elements"), so a few kilobytes of tags can ask for millions of elements. This follows that list
// closely enough to tell such source from untidy pages: more than limits::kReopenedPerTag for each tag are
// never needed.
class OpenFormatting {
  public:
    // The tags in the order of the source; `attributes` is the text behind the name. False when it has become
    // too much.
    bool TakeStart(css::TagId tag, std::string_view attributes);
    bool TakeEnd(css::TagId tag);

  private:
    struct Element {
        css::TagId tag;
        uint64_t attributes;
    };

    bool Spend();
    void Open(css::TagId tag, std::string_view attributes);
    void Close(css::TagId tag);

    Vector<Element, MemoryTag::DOM> open_;
    size_t reopened_ = 0;
    size_t tags_ = 0;
};

}  // namespace qorvex::dom
