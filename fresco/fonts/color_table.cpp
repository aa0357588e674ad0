#include "fresco/fonts/color_table.h"

#include <algorithm>

namespace fresco {
namespace {

constexpr size_t kGlyphList = 14, kLayerList = 18, kClipList = 22;  // in the header
constexpr uint32_t kCount = 4;
constexpr uint32_t kGlyphRecord = 6, kLayerRecord = 4, kClipRecord = 7;

}  // namespace

ColorTable::ColorTable(const void* data, size_t size)
    : data_(static_cast<const uint8_t*>(data)), size_(std::min<size_t>(size, UINT32_MAX / 2)) {
    if (Word(0) < 1) return;
    const auto open = [this](size_t at, uint32_t head, uint32_t record, uint32_t* list, uint32_t* count) {
        *list = Inside(0, Long(at));
        if (*list == 0 || size_ - *list < head) return;
        // No more than there is room for.
        *count = uint32_t(std::min<size_t>(Long(*list + head - kCount), (size_ - *list - head) / record));
    };
    open(kGlyphList, kCount, kGlyphRecord, &glyphs_, &glyphCount_);
    open(kLayerList, kCount, kLayerRecord, &layers_, &layerCount_);
    open(kClipList, 1 + kCount, kClipRecord, &clips_, &clipCount_);
}

uint32_t ColorTable::FindGlyph(uint32_t glyph) const {
    uint32_t low = 0, high = glyphCount_;
    while (low < high) {
        const uint32_t middle = low + (high - low) / 2;
        const size_t record = glyphs_ + kCount + size_t(middle) * kGlyphRecord;
        const uint32_t own = Word(record);
        if (own == glyph) return Inside(glyphs_, Long(record + 2));
        if (own < glyph)
            low = middle + 1;
        else
            high = middle;
    }
    return 0;
}

uint32_t ColorTable::FindLayer(uint32_t index) const {
    if (index >= layerCount_) return 0;
    return Inside(layers_, Long(layers_ + kCount + size_t(index) * kLayerRecord));
}

bool ColorTable::FindClipBox(uint32_t glyph, std::array<double, 4>* box) const {
    uint32_t low = 0, high = clipCount_;
    while (low < high) {
        const uint32_t middle = low + (high - low) / 2;
        const size_t record = clips_ + 1 + kCount + size_t(middle) * kClipRecord;
        if (glyph < Word(record)) {
            high = middle;
        } else if (glyph > Word(record + 2)) {
            low = middle + 1;
        } else {
            const uint32_t at = Follow(clips_, record + 4);
            for (size_t i = 0; i < box->size(); ++i)
                (*box)[i] = Signed(at + 1 + i * 2);
            return at != 0;
        }
    }
    return false;
}

}  // namespace fresco
