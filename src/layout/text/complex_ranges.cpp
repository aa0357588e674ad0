#include "layout/text/complex_ranges.h"

#include <algorithm>
#include <iterator>

namespace qorvex::layout {

namespace {

struct CodeRange {
    uint32_t first;
    uint32_t last;
};

// Ascending. Combining marks, scripts that run from right to left, whose letters join or whose signs move,
// and the pieces of emoji.
constexpr CodeRange kComplex[] = {
    {0x02E5, 0x02E9},   {0x0300, 0x036F},   {0x0591, 0x05BD},   {0x05BF, 0x05CF},   {0x0600, 0x109F},
    {0x1100, 0x11FF},   {0x135D, 0x135F},   {0x1700, 0x18AF},   {0x1900, 0x194F},   {0x1980, 0x19DF},
    {0x1A00, 0x1CFF},   {0x1DC0, 0x1DFF},   {0x20D0, 0x20FF},   {0x2CEF, 0x2CF1},   {0x302A, 0x302F},
    {0x3099, 0x309A},   {0xA67C, 0xA67D},   {0xA6F0, 0xA6F1},   {0xA800, 0xABFF},   {0xD7B0, 0xD7FF},
    {0xFE00, 0xFE0F},   {0xFE20, 0xFE2F},   {0x10A00, 0x10A5F}, {0x11000, 0x1107F}, {0x11080, 0x110CF},
    {0x11100, 0x1114F}, {0x11150, 0x1117F}, {0x11180, 0x111DF}, {0x11200, 0x1124F}, {0x112B0, 0x112FF},
    {0x11300, 0x1137F}, {0x11400, 0x1147F}, {0x11480, 0x114DF}, {0x11580, 0x115FF}, {0x11600, 0x1165F},
    {0x11680, 0x116CF}, {0x11700, 0x11BFF}, {0x11C00, 0x11C6F}, {0x11C70, 0x11CBF}, {0x1E900, 0x1E95F},
    {0x1F1E6, 0x1F1FF}, {0x1F3FB, 0x1F3FF}, {0xE0000, 0xE007F}, {0xE0100, 0xE01EF},
};
static_assert(std::size(kComplex) == 44 && kComplex[0].first == kFirstComplexCode);

// Letters that need no shaping but run from right to left: without the complex path Hebrew would read
// backward.
constexpr CodeRange kRightToLeft[] = {
    {0x05D0, 0x05FF}, {0x200F, 0x200F}, {0x202A, 0x202E},   {0x2066, 0x2069},
    {0xFB1D, 0xFDFF}, {0xFE70, 0xFEFC}, {0x10800, 0x10FFF}, {0x1E800, 0x1EFFF},
};

constexpr CodeRange kExtending[] = {
    {0x0300, 0x036F}, {0x0483, 0x0489},   {0x064B, 0x065F},   {0x1AB0, 0x1AFF},   {0x1DC0, 0x1DFF},
    {0x200C, 0x200D}, {0x20D0, 0x20FF},   {0x302A, 0x302F},   {0x3099, 0x309A},   {0xFE00, 0xFE0F},
    {0xFE20, 0xFE2F}, {0x1F3FB, 0x1F3FF}, {0xE0020, 0xE007F}, {0xE0100, 0xE01EF},
};

constexpr CodeRange kInvisible[] = {
    {kSoftHyphen, kSoftHyphen}, {0x034F, 0x034F}, {0x061C, 0x061C}, {0x180B, 0x180F}, {0x200B, 0x200F},
    {0x202A, 0x202E},           {0x2060, 0x206F}, {0xFE00, 0xFE0F}, {0xFEFF, 0xFEFF}, {0xE0000, 0xE0FFF},
};

template <size_t N>
bool Contains(const CodeRange (&ranges)[N], uint32_t code) {
    const CodeRange* found =
        std::lower_bound(std::begin(ranges), std::end(ranges), code,
                         [](const CodeRange& range, uint32_t value) { return range.last < value; });
    return found != std::end(ranges) && found->first <= code;
}

constexpr bool IsPictograph(uint32_t code) {
    return code >= 0x1F900 && code <= 0x1F9FF;
}

}  // namespace

bool NeedsComplexText(const uint32_t* codes, size_t count) {
    for (size_t i = 0; i < count; ++i) {
        if (codes[i] < kFirstComplexCode) continue;
        if (codes[i] == kZeroWidthJoiner && i > 0 && IsPictograph(codes[i - 1])) return true;
        if (Contains(kComplex, codes[i]) || Contains(kRightToLeft, codes[i])) return true;
    }
    return false;
}

bool ExtendsCharacter(uint32_t code) {
    return code >= kExtending[0].first && Contains(kExtending, code);
}

bool IsInvisible(uint32_t code) {
    return code >= kInvisible[0].first && Contains(kInvisible, code);
}

}  // namespace qorvex::layout
