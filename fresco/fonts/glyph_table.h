// Which glyph a code point has, remembered: a font's own table is a search for each. Any thread.
#pragma once
#include <array>
#include <atomic>
#include <cstdint>

#include "fresco/core/heap.h"

struct hb_font_t;

namespace fresco {

class GlyphTable {
  public:
    GlyphTable() = default;
    ~GlyphTable();
    GlyphTable(const GlyphTable&) = delete;
    GlyphTable& operator=(const GlyphTable&) = delete;

    // 0 for what the font does not have. Always the same font.
    uint32_t Get(hb_font_t* font, uint32_t code) const {
        if (code < kCodes) {
            if (const Page* page = pages_[code / kPageCodes].load(std::memory_order_acquire)) {
                const uint16_t known = page->glyphs[code % kPageCodes].load(std::memory_order_relaxed);
                if (known != kUnknown) return known;
            }
        }
        return Find(font, code);
    }

  private:
    // The first two planes, where all that is written today stands.
    static constexpr uint32_t kCodes = 0x20000;
    static constexpr uint32_t kPageCodes = 256;
    static constexpr uint16_t kUnknown = 0xFFFF;
    struct Page {
        std::array<std::atomic<uint16_t>, kPageCodes> glyphs;
    };

    uint32_t Find(hb_font_t* font, uint32_t code) const;
    Page* MakePage(std::atomic<Page*>& slot) const;

    // Made when a code of theirs is asked for; they stay.
    mutable std::array<std::atomic<Page*>, kCodes / kPageCodes> pages_{};
};

}  // namespace fresco
