// The lines of a paragraph in which text and inline boxes follow each other.
//
// Two passes. Flow measures all content into lines: texts give their own lines, which begin where the content
// before them ended; boxes that are not inline stand as one piece each. Place gives every node below the
// paragraph its box. Everything on a line stands on one baseline, so a line is as tall as the tallest part
// above it and the deepest below it.
//
// An inline box that goes over several lines has one box around all of its lines. `justify` widens the gaps
// between words of lines that went on for want of room, whichever texts these gaps belong to; the boxes
// behind them move along.
//
// A paragraph whose first letter runs from right to left has its lines ordered from the right. A piece moves
// as a whole: where one text mixes directions, its parts do not change places with those of the next text.
#pragma once

#include "css/values/length_context.h"
#include "layout/layout_handle.h"
#include "layout/perform_layout.h"
#include "layout/text/text_info.h"

namespace qorvex::dsp {

class InlineFlow {
  public:
    // `width` NaN: not known, no line is broken. Texts are `scale` times as large as their style says.
    layout::Size Flow(layout::LayoutHandle& paragraph, float width, float scale);
    // After Flow. The corner of the content box, and its width.
    void Place(layout::LayoutPass& pass, layout::LayoutHandle& paragraph, layout::Point origin, float width);
    void Clear();

  private:
    enum class Kind : uint8_t { Text, Box, Inline };
    // In document order; an inline box stands before its content.
    struct Item {
        layout::LayoutHandle* handle;
        Kind kind;
        uint32_t firstPiece = 0;
        uint32_t endPiece = 0;
    };
    // What an item shows on one line.
    struct Piece {
        uint32_t line;
        uint32_t textLine;  // of a text
        uint32_t item;
        float x;
        float width;
        float ascent;
        float descent;
        // By justification: how far it moves, and what each of its gaps takes.
        float moved = 0;
        float gap = 0;
        uint32_t firstGap = 0;
        uint32_t endGap = 0;
        bool gapBehind = false;                                           // the space that ends the text
        layout::BaseDirection direction = layout::BaseDirection::OfText;  // OfText: that of the paragraph
        float Spread() const { return gap * static_cast<float>(endGap - firstGap); }
    };
    struct Line {
        float width = 0;
        float ascent = 0;
        float descent = 0;
        float top = 0;
        float shift = 0;     // by text-align
        bool wraps = false;  // the next line begins because this one is full
    };
    struct Cursor {
        float width;
        float scale;
        layout::BaseDirection base;
        float x = 0;
        // Of inline boxes that were opened behind the last piece: they go to the next line with their
        // content.
        float opened = 0;
    };

    void Walk(layout::LayoutHandle& parent, Cursor& cursor, uint32_t depth);
    void AddText(layout::LayoutHandle& handle, Cursor& cursor);
    void AddBox(layout::LayoutHandle& handle, Cursor& cursor);
    void AddInline(layout::LayoutHandle& handle, Cursor& cursor, uint32_t depth);
    void AddPiece(Item& item, Cursor& cursor, const Piece& piece);
    void NewLine(Cursor& cursor, bool wraps);

    void AlignLines(css::TextAlignType align, float width);
    void JustifyLine(const Line& line, Piece* first, Piece* end, float width);
    void OrderLine(const Line& line, Piece* first, Piece* end, float hung) const;
    void FindGaps(Piece& piece, bool startsLine, bool endsLine) const;
    const layout::TextInfo* TextOf(const Piece& piece) const;
    float SpaceBehind(const Piece& piece) const;
    void PlaceText(layout::LayoutPass& pass, const Item& item, layout::Point origin);
    void PlaceBox(layout::LayoutPass& pass, const Item& item, layout::Point origin);
    void PlaceInline(layout::LayoutPass& pass, const Item& item, layout::Point origin);
    layout::Rect Around(uint32_t firstPiece, uint32_t endPiece, layout::Point origin) const;

    template <class T>
    using List = Vector<T, MemoryTag::LayoutNodes>;
    List<Item> items_;
    List<Piece> pieces_;
    List<Line> lines_;
    List<layout::LayoutHandle*> outOfFlow_;
    layout::BaseDirection base_ = layout::BaseDirection::OfText;
};

}  // namespace qorvex::dsp
