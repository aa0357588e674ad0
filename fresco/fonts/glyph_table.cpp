#include "fresco/fonts/glyph_table.h"

#include <hb.h>

namespace fresco {

GlyphTable::~GlyphTable() {
    for (const std::atomic<Page*>& slot : pages_)
        HeapDelete(slot.load(std::memory_order_relaxed));
}

// Null without memory.
GlyphTable::Page* GlyphTable::MakePage(std::atomic<Page*>& slot) const {
    Page* page = HeapNew<Page>();
    if (!page) return nullptr;
    for (std::atomic<uint16_t>& glyph : page->glyphs)
        glyph.store(kUnknown, std::memory_order_relaxed);
    Page* other = nullptr;
    if (slot.compare_exchange_strong(other, page, std::memory_order_acq_rel)) return page;
    // Another thread was first.
    HeapDelete(page);
    return other;
}

uint32_t GlyphTable::Find(hb_font_t* font, uint32_t code) const {
    hb_codepoint_t found = 0;
    const uint32_t glyph = hb_font_get_nominal_glyph(font, code, &found) ? found : 0;
    if (code >= kCodes || glyph >= kUnknown) return glyph;
    std::atomic<Page*>& slot = pages_[code / kPageCodes];
    Page* page = slot.load(std::memory_order_acquire);
    if (!page) page = MakePage(slot);
    if (page) page->glyphs[code % kPageCodes].store(uint16_t(glyph), std::memory_order_relaxed);
    return glyph;
}

}  // namespace fresco
