// One record for all texts of equal style: of its groups a text writes none itself, so it holds one pointer
// where an element holds the groups.
#pragma once

#include <array>

#include "core/memory/ref_counted.h"
#include "css/values/layout_style_refs.h"

namespace qorvex::css {

// Immutable. What was written is known to those who hold it.
struct SharedStyle final : AtomicRefCounted<SharedStyle, MemoryTag::CSS>, LaidOutStyle {
    explicit SharedStyle(const LaidOutStyle& style);
};
using SharedStylePtr = RefPtr<const SharedStyle>;

// The records made last, by their groups.
class SharedStyles {
  public:
    // The style with these three groups for its own.
    const SharedStylePtr& Get(const LaidOutStyle& style, const StyleHandle<LayoutStyle>& layout,
                              const StyleHandle<VisualStyle>& visual,
                              const StyleHandle<TextLayoutStyle>& text);
    const SharedStylePtr& Get(const LaidOutStyle& style) {
        return Get(style, style.layout, style.visual, style.text);
    }

  private:
    static constexpr unsigned kBits = 5;
    std::array<SharedStylePtr, 1u << kBits> records_;
};

}  // namespace qorvex::css
