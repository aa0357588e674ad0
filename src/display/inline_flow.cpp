#include "display/inline_flow.h"

#include <yoga/Yoga.h>

#include <algorithm>
#include <cmath>

#include "core/memory/temp_vector.h"

#include "display/display_text.h"
#include "layout/flex_results.h"
#include "layout/layout_store.h"

namespace qorvex::dsp {

using layout::BaseDirection;
using layout::LayoutHandle;
using layout::LayoutNode;
using layout::LayoutPass;
using layout::Point;
using layout::Rect;
using layout::Size;

namespace {

float Finite(float value) {
    return std::isfinite(value) ? value : 0;
}

bool IsText(const LayoutNode& node) {
    return node.display && node.display->Has(IDisplayElement::kIsText);
}

// Its content flows with the lines around it; without content it is a box like others.
bool IsInline(const LayoutNode& node) {
    return node.style->layout->display == css::CSSDisplay::Inline && !node.Children().empty() &&
           !node.flags.measuredByDisplayElement && !node.flags.isReplaced;
}

// Edges that Yoga has resolved for a node of its own tree; percentages have no base there and count as 0.
struct OuterEdges {
    layout::Edges border, padding, margin;
    explicit OuterEdges(const LayoutNode& node) {
        const YGNodeConstRef flex = node.flex;
        const auto points = [&](YGValue value) {
            return value.unit == YGUnitPoint ? Finite(value.value) : 0.0f;
        };
        const auto read = [&](layout::Edges& out, auto get) {
            out = {get(YGEdgeLeft), get(YGEdgeRight), get(YGEdgeTop), get(YGEdgeBottom)};
        };
        read(border, [&](YGEdge edge) { return Finite(YGNodeStyleGetBorder(flex, edge)); });
        read(padding, [&](YGEdge edge) { return points(YGNodeStyleGetPadding(flex, edge)); });
        read(margin, [&](YGEdge edge) { return points(YGNodeStyleGetMargin(flex, edge)); });
    }
    float Left() const { return margin.left + border.left + padding.left; }
    float Right() const { return margin.right + border.right + padding.right; }
};

}  // namespace

InlineContent ContentOf(const LayoutNode& node) {
    if (node.style->layout->display == css::CSSDisplay::None) return InlineContent::None;
    const bool hasBox = node.flex != nullptr;  // none beyond the depth limit
    if (node.flags.isAbsolute || node.flags.isFixed)
        return hasBox ? InlineContent::OutOfFlow : InlineContent::None;
    if (IsText(node)) return InlineContent::Text;
    if (!hasBox) return InlineContent::None;
    return IsInline(node) ? InlineContent::Inline : InlineContent::Box;
}

void InlineFlow::Clear() {
    items_.clear();
    pieces_.clear();
    lines_.clear();
    outOfFlow_.clear();
    levels_.clear();
    runPlaces_.clear();
}

Size InlineFlow::Flow(LayoutHandle& paragraph, float width, float scale) {
    Clear();
    FindDirections(paragraph);
    Cursor cursor{width, scale, base_};
    lines_.push_back({});
    Walk(paragraph, cursor, 0);
    lines_.back().width = cursor.x;
    Size size;
    for (Line& line : lines_) {
        line.top = size.height;
        size.height += line.ascent + line.descent;
        size.width = std::max(size.width, line.width);
    }
    return size;
}

void InlineFlow::Walk(LayoutHandle& parent, Cursor& cursor, uint32_t depth) {
    if (depth >= limits::kMaxLayoutDepth) return;
    for (const layout::HandlePtr& child : parent.node().Children()) {
        switch (ContentOf(child->node())) {
            case InlineContent::None:
                break;
            case InlineContent::OutOfFlow:
                outOfFlow_.push_back(child.get());
                break;
            case InlineContent::Text:
                AddText(*child, cursor);
                break;
            case InlineContent::Inline:
                AddInline(*child, cursor, depth);
                break;
            case InlineContent::Box:
                AddBox(*child, cursor);
                break;
        }
    }
}

void InlineFlow::NewLine(Cursor& cursor, bool wraps) {
    lines_.back().width = cursor.x - cursor.opened;
    lines_.back().wraps = wraps;
    lines_.push_back({});
    cursor.x = cursor.opened;
}

void InlineFlow::AddPiece(Item& item, Cursor& cursor, const Piece& piece) {
    Line& line = lines_.back();
    line.ascent = std::max(line.ascent, piece.ascent);
    line.descent = std::max(line.descent, piece.descent);
    pieces_.push_back(piece);
    pieces_.back().opened = cursor.opened;
    item.endPiece = static_cast<uint32_t>(pieces_.size());
    cursor.x = piece.x + piece.width;
    cursor.opened = 0;
}

void InlineFlow::AddText(LayoutHandle& handle, Cursor& cursor) {
    auto& text = static_cast<DisplayText&>(*handle.node().display);
    const auto first = static_cast<uint32_t>(pieces_.size());
    items_.push_back({&handle, Kind::Text, first, first, cursor.text});
    std::span<const uint8_t> levels;
    if (!levels_.empty()) levels = {levels_.data() + cursor.text, text.TextLength()};
    cursor.text += text.TextLength();
    const auto lay = [&] {
        return text.LayoutInline(handle, {cursor.width, cursor.x, cursor.scale, cursor.base, levels});
    };
    // The first word did not fit behind what is there: the text begins on the next line.
    const auto skips = [&](const layout::TextInfo* info) {
        return info != nullptr && info->lines.size() > 1 && info->lines[0].runCount == 0 &&
               !info->lines[0].endsParagraph && cursor.x > 0;
    };
    const layout::TextInfo* info = lay();
    if (cursor.opened > 0 && cursor.x > cursor.opened && skips(info)) {
        NewLine(cursor, true);
        info = lay();
    }
    const float offset = cursor.x;
    const bool skipsFirst = skips(info);
    if (info == nullptr) return;
    for (uint32_t i = 0; i < info->lines.size(); ++i) {
        const layout::TextLineInfo& line = info->lines[i];
        if (i > 0) NewLine(cursor, !info->lines[i - 1].endsParagraph);
        if (i == 0 && skipsFirst) continue;
        const float start = i == 0 ? offset : 0;
        AddPiece(items_.back(), cursor,
                 {static_cast<uint32_t>(lines_.size() - 1), i, static_cast<uint32_t>(items_.size() - 1),
                  start, std::max(line.extent - start, 0.0f), line.baseline, line.height - line.baseline});
    }
}

void InlineFlow::AddBox(LayoutHandle& handle, Cursor& cursor) {
    LayoutNode& node = handle.node();
    YGNodeCalculateLayout(node.flex, YGUndefined, YGUndefined, YGDirectionLTR);
    const OuterEdges edges(node);
    const float width = Finite(YGNodeLayoutGetWidth(node.flex)) + edges.margin.left + edges.margin.right;
    const float height = Finite(YGNodeLayoutGetHeight(node.flex)) + edges.margin.top + edges.margin.bottom;
    if (cursor.x > 0 && cursor.x + width > cursor.width + layout::kLengthTolerance) NewLine(cursor, true);
    const auto first = static_cast<uint32_t>(pieces_.size());
    items_.push_back({&handle, Kind::Box, first, first, cursor.text});
    cursor.text += static_cast<uint32_t>(kBoxSign.size());
    AddPiece(items_.back(), cursor,
             {static_cast<uint32_t>(lines_.size() - 1), 0, static_cast<uint32_t>(items_.size() - 1), cursor.x,
              width, height, 0});
}

void InlineFlow::AddInline(LayoutHandle& handle, Cursor& cursor, uint32_t depth) {
    const OuterEdges edges(handle.node());
    const auto open = static_cast<uint32_t>(items_.size());
    const auto first = static_cast<uint32_t>(pieces_.size());
    items_.push_back({&handle, Kind::Inline, first, first});
    cursor.x += edges.Left();
    cursor.opened += edges.Left();
    Walk(handle, cursor, depth + 1);
    cursor.x += edges.Right();
    if (first == pieces_.size())
        cursor.opened += edges.Right();
    else
        pieces_.back().closed += edges.Right();
    items_[open].endPiece = static_cast<uint32_t>(pieces_.size());
}

// --- Placing

void InlineFlow::AlignLines(css::TextAlignType align, float width) {
    const float part = align == css::TextAlignType::Center  ? 0.5f
                       : align == css::TextAlignType::Right ? 1.0f
                                                            : 0.0f;
    for (Line& line : lines_)
        line.shift = std::max(width - line.width, 0.0f) * part;
    runPlaces_.clear();
    for (uint32_t first = 0; first < pieces_.size();) {
        const uint32_t line = pieces_[first].line;
        uint32_t end = first;
        for (; end < pieces_.size() && pieces_[end].line == line; ++end)
            pieces_[end].moved = pieces_[end].gap = 0;
        if (align == css::TextAlignType::Justify)
            JustifyLine(lines_[line], &pieces_[first], pieces_.data() + end, width);
        for (uint32_t i = first; i < end; ++i) {
            Piece& piece = pieces_[i];
            piece.left = piece.x + piece.moved;
            piece.shown = piece.width + piece.Spread();
            piece.firstPlace = kNoPlace;
        }
        if (!levels_.empty()) OrderLine(lines_[line], &pieces_[first], pieces_.data() + end, 1 - part);
        first = end;
    }
}

const layout::TextInfo* InlineFlow::TextOf(const Piece& piece) const {
    const Item& item = items_[piece.item];
    if (item.kind != Kind::Text) return nullptr;
    const layout::TextInfo* info = static_cast<DisplayText&>(*item.handle->node().display).Info();
    return info != nullptr && piece.textLine < info->lines.size() ? info : nullptr;
}

// A space at the end of a text is width behind its last character.
float InlineFlow::SpaceBehind(const Piece& piece) const {
    const layout::TextInfo* info = TextOf(piece);
    if (info == nullptr) return 0;
    const layout::TextLineInfo& line = info->lines[piece.textLine];
    if (line.runCount == 0) return 0;
    const layout::TextRun& last = info->runs[line.firstRun + line.runCount - 1];
    // Read from right to left it stands on the left.
    const float space = base_ == BaseDirection::RightToLeft ? info->runs[line.firstRun].x - piece.x
                                                            : line.extent - (last.x + last.width);
    return space > layout::kLengthTolerance ? space : 0;
}

// White space at the ends of a line stands between no words.
void InlineFlow::FindGaps(Piece& piece, bool startsLine, bool endsLine) const {
    piece.firstGap = piece.endGap = 0;
    piece.gapBehind = !endsLine && SpaceBehind(piece) > 0;
    const layout::TextInfo* info = TextOf(piece);
    if (info == nullptr) return;
    const layout::TextLineInfo& line = info->lines[piece.textLine];
    const auto place = [&](uint32_t character) {
        return static_cast<uint32_t>(std::lower_bound(info->gaps.begin(), info->gaps.end(), character) -
                                     info->gaps.begin());
    };
    piece.firstGap = place(line.firstCharacter + startsLine);
    piece.endGap = std::max(place(line.endCharacter - (endsLine && line.endCharacter > 0)), piece.firstGap);
}

void InlineFlow::JustifyLine(const Line& line, Piece* first, Piece* end, float width) {
    const float free = width - line.width + SpaceBehind(end[-1]);
    if (!line.wraps || !(free > 0)) return;
    uint32_t gaps = 0;
    for (Piece* piece = first; piece != end; ++piece) {
        FindGaps(*piece, piece == first, piece + 1 == end);
        gaps += piece->endGap - piece->firstGap + piece->gapBehind;
    }
    if (gaps == 0) return;
    const float gap = free / static_cast<float>(gaps);
    float moved = 0;
    for (Piece* piece = first; piece != end; ++piece) {
        piece->gap = gap;
        piece->moved = moved;
        moved += piece->Spread() + (piece->gapBehind ? gap : 0);
    }
}

Rect InlineFlow::Around(uint32_t firstPiece, uint32_t endPiece, Point origin) const {
    if (firstPiece == endPiece) return {origin.x, origin.y, 0, 0, 0};
    float left = 0, top = 0, right = 0, bottom = 0;
    for (uint32_t i = firstPiece; i < endPiece; ++i) {
        const Piece& piece = pieces_[i];
        const Line& line = lines_[piece.line];
        const float x = line.shift + piece.left;
        const float width = piece.shown;
        const float y = line.top + line.ascent - piece.ascent;
        const bool start = i == firstPiece;
        left = start ? x : std::min(left, x);
        top = start ? y : std::min(top, y);
        right = start ? x + width : std::max(right, x + width);
        const float end = y + piece.ascent + piece.descent;
        bottom = start ? end : std::max(bottom, end);
    }
    return {origin.x + left, origin.y + top, 0, right - left, bottom - top};
}

void InlineFlow::PlaceText(LayoutPass& pass, const Item& item, Point origin) {
    LayoutNode& node = item.handle->node();
    const layout::OldBox old(node);
    node.box = Around(item.firstPiece, item.endPiece, origin);
    auto& text = static_cast<DisplayText&>(*node.display);
    const TempMark mark;
    TempVector<layout::LinePlacement> places;
    const layout::TextInfo* info = text.Info();
    places.resize(info ? info->lines.size() : 0, layout::LinePlacement{});
    TempVector<float> runs;
    for (uint32_t i = item.firstPiece; i < item.endPiece; ++i) {
        const Piece& piece = pieces_[i];
        const Line& line = lines_[piece.line];
        if (piece.textLine < places.size()) {
            places[piece.textLine] = {origin.x + line.shift + piece.moved - node.box.x,
                                      origin.y + line.top + line.ascent - node.box.y, piece.gap,
                                      piece.firstGap, piece.endGap};
        }
        if (piece.firstPlace == kNoPlace) continue;
        const layout::TextLineInfo& laid = info->lines[piece.textLine];
        if (runs.empty()) runs.resize(info->runs.size(), NAN);
        std::copy_n(&runPlaces_[piece.firstPlace], laid.runCount, &runs[laid.firstRun]);
    }
    text.PlaceLines(places.data(), places.size(), runs.empty() ? nullptr : runs.data());
    NoteBoxChange(*item.handle, old, pass);
}

void InlineFlow::PlaceBox(LayoutPass& pass, const Item& item, Point origin) {
    LayoutNode& node = item.handle->node();
    const Rect outer = Around(item.firstPiece, item.endPiece, origin);
    const OuterEdges edges(node);
    layout::FlexReadRoot root{item.handle, nullptr, {}, pass.everything};
    root.origin = {outer.x + edges.margin.left - Finite(YGNodeLayoutGetLeft(node.flex)),
                   outer.y + edges.margin.top - Finite(YGNodeLayoutGetTop(node.flex))};
    ReadYogaResults(root, pass);
}

void InlineFlow::PlaceInline(LayoutPass& pass, const Item& item, Point origin) {
    LayoutNode& node = item.handle->node();
    const layout::OldBox old(node);
    const OuterEdges edges(node);
    node.AsBox().edges.Set({edges.border, edges.padding, edges.margin}, item.handle->store().recentEdges);
    const Rect content = Around(item.firstPiece, item.endPiece, origin);
    const layout::Edges around{edges.border.left + edges.padding.left,
                               edges.border.right + edges.padding.right, edges.border.top + edges.padding.top,
                               edges.border.bottom + edges.padding.bottom};
    node.box = {content.x - around.left, content.y - around.top, 0,
                content.width + around.left + around.right, content.height + around.top + around.bottom};
    NoteBoxChange(*item.handle, old, pass);
}

void InlineFlow::Place(LayoutPass& pass, LayoutHandle& paragraph, Point origin, float width) {
    AlignLines(paragraph.node().style->text->textAlign, width);
    for (const Item& item : items_) {
        switch (item.kind) {
            case Kind::Text:
                PlaceText(pass, item, origin);
                break;
            case Kind::Box:
                PlaceBox(pass, item, origin);
                break;
            case Kind::Inline:
                PlaceInline(pass, item, origin);
                break;
        }
    }
    // Out of the flow, at the content's corner and moved by left and top alone.
    for (LayoutHandle* handle : outOfFlow_) {
        LayoutNode& node = handle->node();
        YGNodeCalculateLayout(node.flex, YGUndefined, YGUndefined, YGDirectionLTR);
        const auto inset = [&](YGEdge edge) {
            const YGValue value = YGNodeStyleGetPosition(node.flex, edge);
            return value.unit == YGUnitPoint ? Finite(value.value) : 0.0f;
        };
        layout::FlexReadRoot root{handle, nullptr, {}, pass.everything};
        root.origin = {origin.x + inset(YGEdgeLeft) - Finite(YGNodeLayoutGetLeft(node.flex)),
                       origin.y + inset(YGEdgeTop) - Finite(YGNodeLayoutGetTop(node.flex))};
        ReadYogaResults(root, pass);
    }
}

}  // namespace qorvex::dsp
