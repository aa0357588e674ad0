// Laid-out text: lines of positioned glyph runs. A value that measuring fills and painting reads; all arrays
// are flat, so that a label of one line costs three small blocks.
#pragma once

#include <fresco/paint.h>

#include "core/memory/containers.h"
#include "layout/text/text_style.h"

namespace qorvex::layout {

template <class T>
using TextArray = Vector<T, MemoryTag::LayoutData>;

// Glyphs of one font and one direction on one line.
struct TextRun {
    uint32_t font = css::kNoTypeface;
    uint32_t firstGlyph = 0;  // in TextInfo::glyphs; positions are relative to the run
    uint32_t glyphCount = 0;
    uint32_t firstCharacter = 0;  // in the collapsed text, code points
    uint32_t endCharacter = 0;
    float x = 0;  // in the line, alignment included
    float width = 0;
    uint8_t level = 0;  // as in Unicode Annex 9
    bool rightToLeft = false;
};

// The sign that stands for what was cut off; it is a run of its own behind the others.
struct TextEllipsis {
    uint32_t glyph = 0;
    uint32_t font = css::kNoTypeface;  // kNoTypeface: the line is not cut
    float advance = 0;
    float x = 0;
};

struct TextLineInfo {
    uint32_t firstRun = 0;  // in TextInfo::runs
    uint32_t runCount = 0;
    uint32_t firstCharacter = 0;
    uint32_t endCharacter = 0;
    float x = 0;       // that alignment gave the line
    float width = 0;   // of the widest line, after alignment
    float extent = 0;  // where the line's own content ends; counted from the line's start
    float height = 0;
    float baseline = 0;          // from the line's top
    bool endsParagraph = false;  // by a line feed or the end of the text
    TextEllipsis ellipsis;
};

// Where a line of an inline flow stands, from the corner of the text's box.
struct LinePlacement {
    float x = 0;
    float baseline = 0;
    float gap = 0;  // what justification adds to each of these gaps, see TextInfo::gaps
    uint32_t firstGap = 0;
    uint32_t endGap = 0;
};

struct TextInfo {
    // Most texts are one run on one line.
    SmallVector<TextLineInfo, 1, MemoryTag::LayoutData> lines;
    SmallVector<TextRun, 1, MemoryTag::LayoutData> runs;
    TextArray<fresco::Glyph> glyphs;  // one for each character, spaces included, in the plain path
    // For each glyph the character that its cluster begins with; empty where glyph i of a run is its
    // character i.
    TextArray<uint32_t> clusters;
    // For each character the edge in its run at which reading it begins; empty with `clusters`.
    TextArray<float> positions;
    // The characters between words, ascending; of texts in an inline flow, whose lines others share.
    TextArray<uint32_t> gaps;
    float width = 0;
    float height = 0;
    float usedSize = 0;    // font size of this layout in pixels
    bool wrapped = false;  // some line ended because of the available width

    void Clear() {
        lines.clear();
        runs.clear();
        glyphs.clear();
        clusters.clear();
        positions.clear();
        gaps.clear();
        width = height = 0;
        wrapped = false;
    }
};

}  // namespace qorvex::layout
