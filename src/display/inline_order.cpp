// The directions of a paragraph's text and the order of its lines (Unicode Annex 9).
#include <qorvex/text_services.h>

#include <algorithm>

#include "display/display_text.h"
#include "display/inline_flow.h"
#include "layout/layout_store.h"
#include "layout/text/direction_runs.h"

namespace qorvex::dsp {

using layout::BaseDirection;
using layout::LayoutHandle;

namespace {

// Lead bytes below this one begin no letter that runs from right to left.
constexpr uint8_t kFirstBackwardLead = 0xD6;

struct ParagraphText {
    TempVector<char> text;
    bool mayRunBackward = false;
};

// In the order of InlineFlow::Walk.
void CollectText(const LayoutHandle& parent, uint32_t depth, ParagraphText& out) {
    if (depth >= limits::kMaxLayoutDepth) return;
    for (const layout::HandlePtr& child : parent.node().Children()) {
        const layout::LayoutNode& node = child->node();
        const InlineContent content = ContentOf(node);
        if (content == InlineContent::Inline) CollectText(*child, depth + 1, out);
        if (content == InlineContent::Box) out.text.append(kBoxSign.begin(), kBoxSign.end());
        if (content != InlineContent::Text) continue;
        const std::string_view part = static_cast<const DisplayText&>(*node.display).Text();
        out.text.append(part.begin(), part.end());
        out.mayRunBackward |= std::any_of(part.begin(), part.end(), [](char byte) {
            return static_cast<uint8_t>(byte) >= kFirstBackwardLead;
        });
    }
}

}  // namespace

void InlineFlow::FindDirections(const LayoutHandle& paragraph) {
    base_ = BaseDirection::OfText;
    const layout::TextServices& services = paragraph.store().text;
    if (services.i18n == nullptr || !services.complexText) return;
    const TempMark mark;
    ParagraphText all;
    CollectText(paragraph, 0, all);
    if (!all.mayRunBackward) return;
    const std::string_view text(all.text.data(), all.text.size());
    levels_.resize(text.size(), uint8_t{0});
    layout::ResolveByteLevels(*services.i18n, text, {levels_.data(), levels_.size()});
    if (std::all_of(levels_.begin(), levels_.end(), [](uint8_t level) { return level == 0; })) {
        levels_.clear();
        return;
    }
    const TextDirection first =
        services.i18n->ComputeBaseDirection(text.data(), static_cast<unsigned>(text.size()));
    base_ = first == TextDirection::RightToLeft ? BaseDirection::RightToLeft : BaseDirection::LeftToRight;
}

uint8_t InlineFlow::LevelAt(size_t byte) const {
    const uint8_t base = base_ == BaseDirection::RightToLeft ? 1 : 0;
    return byte < levels_.size() ? std::max(levels_[byte], base) : base;
}

// In the order of reading.
void InlineFlow::AddUnits(const Piece& piece, bool endsLine, TempVector<Unit>& out) const {
    const Item& item = items_[piece.item];
    const layout::TextInfo* info = TextOf(piece);
    const layout::TextLineInfo* line = info != nullptr ? &info->lines[piece.textLine] : nullptr;
    if (line == nullptr || line->runCount == 0 || line->ellipsis.font != css::kNoTypeface) {
        out.push_back({piece.left, piece.shown, 0, 0, kNoPlace, LevelAt(item.text)});
        return;
    }
    const size_t start = out.size();
    const auto gapsBefore = [&](uint32_t character) {
        const uint32_t* first = info->gaps.data() + piece.firstGap;
        return std::lower_bound(first, info->gaps.data() + piece.endGap, character) - first;
    };
    for (uint32_t i = line->firstRun; i < line->firstRun + line->runCount; ++i) {
        const layout::TextRun& run = info->runs[i];
        const auto gaps = static_cast<float>(gapsBefore(run.endCharacter) - gapsBefore(run.firstCharacter));
        out.push_back(
            {0, run.width + piece.gap * gaps, 0, 0, i, std::max(run.level, LevelAt(levels_.size()))});
    }
    std::sort(out.begin() + start, out.end(), [&](const Unit& a, const Unit& b) {
        return info->runs[a.run].firstCharacter < info->runs[b.run].firstCharacter;
    });
    float x = piece.left;
    for (size_t i = start; i < out.size(); ++i) {
        out[i].x = x;
        x += out[i].width;
    }
    const float space = SpaceBehind(piece);
    if (space <= 0) return;
    // At the end of a line it goes with the paragraph (rule L1).
    const size_t last = static_cast<const DisplayText&>(*item.handle->node().display).TextLength() - 1;
    out.push_back({x, space, 0, 0, kNoPlace, LevelAt(endsLine ? levels_.size() : item.text + last)});
}

// Rule L2, with what stands between two parts going along: a stretch of a level is mirrored in its own
// bounds, from the highest level down. A paragraph from right to left is mirrored as a whole; `hung` is the
// part of the space behind a line's end that hangs over its left edge.
void InlineFlow::OrderLine(const Line& line, Piece* first, Piece* end, float hung) {
    const TempMark mark;
    TempVector<Unit> units;
    TempVector<size_t> ends;  // of the units of each piece
    for (const Piece* piece = first; piece != end; ++piece) {
        const size_t opening = units.size();
        AddUnits(*piece, piece + 1 == end, units);
        ends.push_back(units.size());
        units[opening].opened = piece->opened;
        units[opening].x -= piece->opened;
        units[opening].width += piece->opened;
        units.back().closed = piece->closed;
        units.back().width += piece->closed;
    }
    uint8_t highest = 0;
    for (const Unit& unit : units)
        highest = std::max(highest, unit.level);
    const float lineEnd = std::max(end[-1].left + end[-1].shown, line.width) - SpaceBehind(end[-1]) * hung;
    for (uint8_t level = highest; level > 0; --level) {
        for (Unit* from = units.begin(); from != units.end();) {
            if (from->level < level) {
                ++from;
                continue;
            }
            const bool whole = base_ == BaseDirection::RightToLeft && level == 1;
            float left = whole ? 0 : from->x, right = whole ? lineEnd : from->x + from->width;
            Unit* to = from;
            for (; to != units.end() && to->level >= level; ++to) {
                if (whole) continue;
                left = std::min(left, to->x);
                right = std::max(right, to->x + to->width);
            }
            for (; from != to; ++from)
                from->x = left + right - (from->x + from->width);
        }
    }
    size_t unit = 0;
    for (Piece* piece = first; piece != end; ++piece) {
        const size_t next = ends[static_cast<size_t>(piece - first)];
        TakeUnits(*piece, units.data() + unit, units.data() + next);
        unit = next;
    }
}

void InlineFlow::TakeUnits(Piece& piece, const Unit* first, const Unit* end) {
    float left = first->Left(), right = left;
    for (const Unit* unit = first; unit != end; ++unit) {
        left = std::min(left, unit->Left());
        right = std::max(right, unit->Left() + unit->Width());
    }
    piece.moved = left - piece.x;
    piece.left = left;
    piece.shown = right - left;
    if (first->run == kNoPlace) return;
    // A text whose runs keep their distances moves as it was laid.
    const layout::TextInfo& info = *TextOf(piece);
    const layout::TextLineInfo& line = info.lines[piece.textLine];
    piece.moved = first->Left() - info.runs[first->run].x;
    bool alike = piece.gap == 0;
    for (const Unit* unit = first; unit != end && unit->run != kNoPlace; ++unit)
        alike = alike && layout::Near(unit->Left() - info.runs[unit->run].x, piece.moved);
    if (alike) return;
    piece.moved = 0;
    piece.firstPlace = static_cast<uint32_t>(runPlaces_.size());
    runPlaces_.resize(runPlaces_.size() + line.runCount);
    for (const Unit* unit = first; unit != end && unit->run != kNoPlace; ++unit)
        runPlaces_[piece.firstPlace + (unit->run - line.firstRun)] = unit->Left();
}

}  // namespace qorvex::dsp
