#include "dom/font_usage.h"

#include <fresco/font.h>

#include <algorithm>

#include "core/limits.h"
#include "layout/text/complex_ranges.h"
#include "qsl/city_hash.h"

namespace qorvex::dom {

namespace {

struct Work {
    FontUsage::Typefaces typefaces;
    Vector<uint32_t, MemoryTag::DOM> codes;
    FontUsage::ShapedTexts texts;
};

// Every character goes to the first font that has it, as text layout does.
void Preload(fresco::IFontService& service, const Work& work) {
    Vector<uint32_t, MemoryTag::DOM> codes(work.codes.begin(), work.codes.end());
    Vector<uint32_t, MemoryTag::DOM> glyphs;
    for (const uint32_t id : work.typefaces) {
        const fresco::IFont* font = id == css::kNoTypeface ? nullptr : service.GetFont(id);
        if (font == nullptr || codes.empty()) continue;
        glyphs.resize(codes.size());
        font->GetGlyphIndices(codes.data(), codes.size(), glyphs.data());
        size_t missing = 0, found = 0;
        Vector<uint32_t, MemoryTag::DOM> own(codes.size());
        for (size_t i = 0; i < codes.size(); ++i) {
            if (glyphs[i] != 0)
                own[found++] = codes[i];
            else
                codes[missing++] = codes[i];
        }
        font->PreloadGlyphs(own.data(), found);
        codes.resize(missing);
    }
}

void PreloadTexts(fresco::IFontService& service, const Work& work) {
    for (const FontUsage::ShapedText& shaped : work.texts) {
        for (const uint32_t id : work.typefaces) {
            const fresco::IFont* font = id == css::kNoTypeface ? nullptr : service.GetFont(id);
            uint32_t glyph = 0;
            if (font != nullptr) font->GetGlyphIndices(&shaped.letter, 1, &glyph);
            if (glyph == 0) continue;
            font->PreloadText(shaped.text.data(), shaped.text.size());
            break;
        }
    }
}

}  // namespace

bool FontUsage::Entry::IsNew(uint32_t code) {
    if (code >= 0x80) return seen.size() < limits::kPreloadedCharacters && seen.insert(code).second;
    const uint64_t bit = uint64_t{1} << (code & 63);
    if (ascii[code >> 6] & bit) return false;
    ascii[code >> 6] |= bit;
    return code > 0x20;
}

bool FontUsage::Entry::IsNewText(std::string_view utf8) {
    return utf8.size() <= limits::kPreloadedTextBytes && seenTexts.size() < limits::kPreloadedTexts &&
           seenTexts.insert(qsl::CityHash64(utf8)).second;
}

void FontUsage::Add(const Typefaces& typefaces, std::string_view utf8) {
    const auto first =
        std::find_if(typefaces.begin(), typefaces.end(), [](uint32_t id) { return id != css::kNoTypeface; });
    if (first == typefaces.end()) return;
    Entry& entry = entries_[*first];
    entry.typefaces = typefaces;
    uint32_t complex = 0;
    for (size_t at = 0; at < utf8.size();) {
        const auto lead = static_cast<uint8_t>(utf8[at++]);
        uint32_t code = lead;
        if (lead >= 0x80) {
            // A cut or wrong sequence gives some character or other; nothing depends on it.
            code = lead & (lead >= 0xF0 ? 0x07 : lead >= 0xE0 ? 0x0F : 0x1F);
            while (at < utf8.size() && (static_cast<uint8_t>(utf8[at]) & 0xC0) == 0x80)
                code = code << 6 | (static_cast<uint8_t>(utf8[at++]) & 0x3F);
        }
        if (complex == 0 && code >= layout::kFirstComplexCode && layout::NeedsComplexText(&code, 1))
            complex = code;
        if (!entry.IsNew(code)) continue;
        entry.fresh.push_back(code);
        has_fresh_ = true;
    }
    if (complex == 0 || !entry.IsNewText(utf8)) return;
    entry.freshTexts.push_back({TaggedString<MemoryTag::DOM>(utf8), complex});
    has_fresh_ = true;
}

TaskPtr FontUsage::TakeTask(fresco::IFontService& service) {
    if (!has_fresh_) return TaskPtr();
    has_fresh_ = false;
    Vector<Work, MemoryTag::DOM> work;
    for (auto& slot : entries_) {
        Entry& entry = slot.second;
        if (entry.fresh.empty() && entry.freshTexts.empty()) continue;
        work.push_back({entry.typefaces, std::move(entry.fresh), std::move(entry.freshTexts)});
        entry.fresh = {};
        entry.freshTexts = {};
    }
    return MakeTask("PreloadFontData", [&service, work = std::move(work)](TaskFamilyHandle) {
        for (const Work& one : work) {
            Preload(service, one);
            PreloadTexts(service, one);
        }
    });
}

}  // namespace qorvex::dom
