// What style solving asks of the fonts: the faces for a family list. Implemented by the font manager.
// DOM thread only.
#pragma once

#include <cstdint>

#include "css/values/style_groups.h"
#include "layout/node_link.h"

namespace qorvex::css {
struct FontFace;
}

namespace qorvex::layout {

using TypefaceList = css::CssSmallVector<uint32_t, 4>;

class IFontResolver {
  public:
    // Fills `out` with one font id per family, searched by weight as CSS Fonts, 5.2 says, and the embedded
    // fallback font behind them. A family whose face is still loading, or that does not exist, leaves
    // css::kNoTypeface in its place; while one is loading the waiter is told of its arrival, through its
    // link, and asks again. `weight` is a code from 1 to 9.
    virtual void ResolveTypefaces(const css::FontFamily& families, css::FontStyle style, uint8_t weight,
                                  const NodeLinkPtr& waiter, TypefaceList& out) = 0;

    // A @font-face rule of a page: its file is loaded and answers for the family from then on.
    virtual void AddFontFace(const css::FontFace& face) = 0;

  protected:
    ~IFontResolver() = default;
};

}  // namespace qorvex::layout
