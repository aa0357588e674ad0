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
// Directions are those of the whole paragraph, in which a box stands for one neutral sign. A paragraph whose
// first letter runs from right to left has its lines ordered from the right; on each line the parts of all
// its texts change places together, whichever elements they belong to.
#pragma once

#include <string_view>

#include "core/memory/temp_vector.h"
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
    static constexpr uint32_t kNoPlace = 0xFFFFFFFF;
    // In document order; an inline box stands before its content.
    struct Item {
        layout::LayoutHandle* handle;
        Kind kind;
        uint32_t firstPiece = 0;
        uint32_t endPiece = 0;
        uint32_t text = 0;  // where its text, or the sign for it, stands in levels_
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
        bool gapBehind = false;  // the space that ends the text
        // Edges of the inline boxes that open in front of it and close behind it.
        float opened = 0;
        float closed = 0;
        // Where it shows on the line, when all has its place.
        float left = 0;
        float shown = 0;
        uint32_t firstPlace = kNoPlace;  // in runPlaces_, of its runs; kNoPlace: they moved with it
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
        uint32_t text = 0;  // in levels_
    };
    // A part of a line that stays whole: a run of a text, the space behind it, a box; with the edges around
    // it.
    struct Unit {
        float x;
        float width;
        float opened;
        float closed;
        // Edges keep their sides where they belong to one unit; else those that opened stand where reading
        // began.
        float Left() const { return x + (level & 1 && !(opened > 0 && closed > 0) ? closed : opened); }
        float Width() const { return width - opened - closed; }
        uint32_t run;  // in TextInfo::runs; kNoPlace: none
        uint8_t level;
    };

    void FindDirections(const layout::LayoutHandle& paragraph);
    void Walk(layout::LayoutHandle& parent, Cursor& cursor, uint32_t depth);
    void AddText(layout::LayoutHandle& handle, Cursor& cursor);
    void AddBox(layout::LayoutHandle& handle, Cursor& cursor);
    void AddInline(layout::LayoutHandle& handle, Cursor& cursor, uint32_t depth);
    void AddPiece(Item& item, Cursor& cursor, const Piece& piece);
    void NewLine(Cursor& cursor, bool wraps);

    void AlignLines(css::TextAlignType align, float width);
    void JustifyLine(const Line& line, Piece* first, Piece* end, float width);
    void OrderLine(const Line& line, Piece* first, Piece* end, float hung);
    void AddUnits(const Piece& piece, bool endsLine, TempVector<Unit>& out) const;
    void TakeUnits(Piece& piece, const Unit* first, const Unit* end);
    uint8_t LevelAt(size_t byte) const;
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
    // Of each byte of the paragraph's text; empty where all of it runs from left to right.
    List<uint8_t> levels_;
    List<float> runPlaces_;
};

// U+FFFC, which a box is to the order of directions.
inline constexpr std::string_view kBoxSign = "\xEF\xBF\xBC";

// What a node below a paragraph is to its lines.
enum class InlineContent : uint8_t { None, OutOfFlow, Text, Inline, Box };
InlineContent ContentOf(const layout::LayoutNode& node);

}  // namespace qorvex::dsp
