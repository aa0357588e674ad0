#include "fresco/fonts/shape_cache.h"

#include <hb.h>

#include <algorithm>
#include <cstring>

namespace fresco {
namespace {

// HarfBuzz looks at no more neighbours of a run than this.
constexpr size_t kContext = 5;
constexpr size_t kKeyHead = 5;
constexpr size_t kMaxKey = kKeyHead + ShapeCache::kMaxCachedRun + 2 * kContext;
// Marks that are shaped together: HarfBuzz looks for the letter below each of them, past all those before it.
constexpr size_t kMaxMarks = 256;
// Scratch memory that waits for the next run; one for each thread that shapes at once.
constexpr size_t kKeptScratch = 4;

// The run and what surrounds it, as HarfBuzz wants them.
struct Text {
    const uint32_t* codes;
    size_t length, offset, count;

    explicit Text(const ShapeRequest& request) {
        const bool inContext = request.context && request.contextOffset <= request.contextCount &&
                               request.count <= request.contextCount - request.contextOffset;
        codes = inContext ? request.context : request.codePoints;
        length = inContext ? request.contextCount : request.count;
        offset = inContext ? request.contextOffset : 0;
        count = request.count;
    }
    size_t Before() const { return std::min(offset, kContext); }
    size_t After() const { return std::min(length - offset - count, kContext); }
};

hb_language_t LanguageOf(const ShapeRequest& request, const ShapeSettings& settings) {
    if (request.language) return hb_language_from_string(request.language, -1);
    return settings.language.load(std::memory_order_relaxed);
}

// Returns the length of the key.
size_t MakeKey(const ShapeRequest& request, hb_language_t language, uint32_t* key) {
    const Text text(request);
    const auto languageBits = reinterpret_cast<uintptr_t>(language);
    key[0] = uint32_t(request.direction) | uint32_t(text.Before()) << 8 | uint32_t(text.After()) << 16;
    key[1] = request.script;
    key[2] = uint32_t(languageBits);
    key[3] = uint32_t(uint64_t(languageBits) >> 32);
    key[4] = uint32_t(text.count);
    const size_t length = text.Before() + text.count + text.After();
    std::memcpy(key + kKeyHead, text.codes + text.offset - text.Before(), length * sizeof(uint32_t));
    return kKeyHead + length;
}

uint64_t HashOf(const uint32_t* key, size_t length) {
    uint64_t hash = 0x9E3779B97F4A7C15ull;
    const auto mix = [&hash](uint64_t part) {
        hash = (hash ^ part) * 0xD6E8FEB86659FD93ull;
        hash ^= hash >> 32;
    };
    size_t i = 0;
    for (; i + 1 < length; i += 2)
        mix(uint64_t(key[i]) << 32 | key[i + 1]);
    if (i < length) mix(key[i]);
    return hash;
}

// Scripts that one set of rules of a font serves share a run: Japanese changes script with every other word.
hb_script_t RuleScript(hb_script_t script) {
    switch (script) {
        case HB_SCRIPT_HIRAGANA:
        case HB_SCRIPT_KATAKANA:
        case HB_SCRIPT_BOPOMOFO:
            return HB_SCRIPT_HAN;
        default:
            return script;
    }
}

bool HasOwnScript(hb_script_t script) {
    return script != HB_SCRIPT_COMMON && script != HB_SCRIPT_INHERITED && script != HB_SCRIPT_UNKNOWN;
}

// Ranges that most text is made of: their letters need not be looked up one by one.
struct ScriptRange {
    uint32_t first, last;
    hb_script_t script;
};
constexpr ScriptRange kScriptRanges[] = {
    {0x41, 0x5A, HB_SCRIPT_LATIN},      {0x61, 0x7A, HB_SCRIPT_LATIN},
    {0x400, 0x481, HB_SCRIPT_CYRILLIC}, {0x5D0, 0x5EA, HB_SCRIPT_HEBREW},
    {0x620, 0x64A, HB_SCRIPT_ARABIC},   {0x904, 0x939, HB_SCRIPT_DEVANAGARI},
    {0xE01, 0xE3A, HB_SCRIPT_THAI},     {0x3041, 0x3096, HB_SCRIPT_HIRAGANA},
    {0x4E00, 0x9FFF, HB_SCRIPT_HAN},    {0xAC00, 0xD7A3, HB_SCRIPT_HANGUL},
};

// Asked for one character after the other, remembers the range of the last one.
class ScriptFinder {
  public:
    hb_script_t Of(uint32_t code) {
        // The tatweel stretches letters of several scripts.
        if (code < 0x41 || code == 0x640) return HB_SCRIPT_COMMON;
        if (code - range_->first <= range_->last - range_->first) return range_->script;
        for (const ScriptRange& range : kScriptRanges) {
            if (code < range.first || code > range.last) continue;
            range_ = &range;
            return range.script;
        }
        return hb_unicode_script(hb_unicode_funcs_get_default(), code);
    }

  private:
    const ScriptRange* range_ = kScriptRanges;
};

// The end of the item that starts at `first`: characters without a script of their own join what is before.
size_t ScriptItemEnd(const uint32_t* codes, size_t first, size_t end, hb_script_t* script) {
    ScriptFinder finder;
    *script = HB_SCRIPT_INVALID;
    for (size_t i = first; i < end; ++i) {
        const hb_script_t own = finder.Of(codes[i]);
        if (!HasOwnScript(own)) continue;
        if (*script == HB_SCRIPT_INVALID)
            *script = own;
        else if (RuleScript(own) != RuleScript(*script))
            return i;
    }
    return end;
}

bool IsMark(uint32_t code) {
    if (code < 0x300 || (code >= 0x4E00 && code <= 0x9FFF)) return false;
    const auto category = hb_unicode_general_category(hb_unicode_funcs_get_default(), code);
    return category == HB_UNICODE_GENERAL_CATEGORY_NON_SPACING_MARK ||
           category == HB_UNICODE_GENERAL_CATEGORY_ENCLOSING_MARK ||
           category == HB_UNICODE_GENERAL_CATEGORY_SPACING_MARK;
}

// Where the first row of too many marks is cut, else `end`.
size_t EndOfMarks(const uint32_t* codes, size_t first, size_t end) {
    if (end - first <= kMaxMarks) return end;
    size_t marks = 0;
    for (size_t i = first; i < end; ++i) {
        marks = IsMark(codes[i]) ? marks + 1 : 0;
        if (marks > kMaxMarks) return i;
    }
    return end;
}

void ShapeItem(hb_font_t* font, const Text& text, size_t first, size_t end, hb_script_t script,
               hb_direction_t direction, hb_language_t language, hb_buffer_t* buffer,
               Vector<UnitGlyph>* out) {
    hb_buffer_clear_contents(buffer);
    hb_buffer_add_codepoints(buffer, text.codes, int(text.length), unsigned(first), int(end - first));
    hb_buffer_set_direction(buffer, direction);
    if (script != HB_SCRIPT_INVALID) hb_buffer_set_script(buffer, script);
    if (language) hb_buffer_set_language(buffer, language);
    hb_buffer_guess_segment_properties(buffer);
    hb_shape(font, buffer, nullptr, 0);
    unsigned count = 0;
    const hb_glyph_info_t* infos = hb_buffer_get_glyph_infos(buffer, &count);
    const hb_glyph_position_t* positions = hb_buffer_get_glyph_positions(buffer, nullptr);
    const size_t at = out->size();
    out->resize(at + count);
    for (unsigned i = 0; i < count; ++i) {
        (*out)[at + i] = {infos[i].codepoint, infos[i].cluster - uint32_t(text.offset),
                          positions[i].x_advance, positions[i].x_offset, -positions[i].y_offset};
    }
}

}  // namespace

ShapedRun* ShapedRun::Create(const uint32_t* key, size_t keyLength, const UnitGlyph* glyphs, size_t count) {
    const size_t size = sizeof(ShapedRun) + keyLength * sizeof(uint32_t) + count * sizeof(UnitGlyph);
    void* block = HeapAllocate(size, alignof(ShapedRun));
    if (!block) HeapExhausted(size);
    auto* run = new (block) ShapedRun(keyLength, count);
    if (keyLength) std::memcpy(run->Words(), key, keyLength * sizeof(uint32_t));
    if (count) std::memcpy(run->Words() + keyLength, glyphs, count * sizeof(UnitGlyph));
    return run;
}

void ShapedRun::Release() const {
    if (references_.fetch_sub(1, std::memory_order_acq_rel) == 1)
        HeapFree(const_cast<ShapedRun*>(this), alignof(ShapedRun));
}

struct ShapeCache::Scratch {
    struct Item {
        size_t first, end;
        hb_script_t script;
    };
    Scratch() = default;
    ~Scratch() { hb_buffer_destroy(buffer); }
    Scratch(const Scratch&) = delete;
    Scratch& operator=(const Scratch&) = delete;

    hb_buffer_t* buffer = hb_buffer_create();
    Vector<Item> items;
    Vector<UnitGlyph> glyphs;
};

ShapeCache::ShapeCache(const ShapeSettings& settings) : settings_(settings) {}
ShapeCache::~ShapeCache() = default;

ShapeCache::ScratchPtr ShapeCache::TakeScratch() {
    {
        std::lock_guard lock(mutex_);
        if (!scratch_.empty()) {
            ScratchPtr taken = std::move(scratch_.back());
            scratch_.pop_back();
            return taken;
        }
    }
    ScratchPtr made(HeapNew<Scratch>());
    if (!made) HeapExhausted(sizeof(Scratch));
    return made;
}

void ShapeCache::ReturnScratch(ScratchPtr scratch) {
    // One large text must not hold its memory for ever.
    constexpr size_t kLargeText = 16 * 1024;
    if (scratch->glyphs.capacity() > kLargeText) return;
    scratch->glyphs.clear();
    std::lock_guard lock(mutex_);
    if (scratch_.size() < kKeptScratch) scratch_.push_back(std::move(scratch));
}

void ShapeCache::Shape(hb_font_t* font, const ShapeRequest& request, Scratch& scratch) const {
    const Text text(request);
    const bool backward = request.direction == TextDirection::RightToLeft;
    const hb_direction_t direction = backward ? HB_DIRECTION_RTL : HB_DIRECTION_LTR;
    const hb_language_t language = LanguageOf(request, settings_);
    const size_t end = text.offset + text.count;
    Vector<Scratch::Item>& items = scratch.items;
    items.clear();
    for (size_t first = text.offset; first < end;) {
        hb_script_t script = hb_script_from_iso15924_tag(request.script);
        const size_t itemEnd = request.script ? end : ScriptItemEnd(text.codes, first, end, &script);
        for (; first < itemEnd; first = items.back().end)
            items.push_back({first, EndOfMarks(text.codes, first, itemEnd), script});
    }
    // In visual order, which for a backward run begins with its last item.
    if (backward) std::reverse(items.begin(), items.end());
    for (const Scratch::Item& item : items) {
        ShapeItem(font, text, item.first, item.end, item.script, direction, language, scratch.buffer,
                  &scratch.glyphs);
    }
}

ShapedRunPtr ShapeCache::Find(uint64_t hash, const uint32_t* key, size_t length) {
    std::lock_guard lock(mutex_);
    if (const auto found = young_.find(hash); found != young_.end())
        return found->second->HasKey(key, length) ? found->second : ShapedRunPtr();
    const auto found = old_.find(hash);
    if (found == old_.end() || !found->second->HasKey(key, length)) return {};
    ShapedRunPtr run = std::move(found->second);
    old_.erase(found);
    youngGlyphs_ += run->Count();
    young_[hash] = run;
    return run;
}

void ShapeCache::Insert(uint64_t hash, ShapedRunPtr run) {
    std::lock_guard lock(mutex_);
    youngGlyphs_ += run->Count();
    young_[hash] = std::move(run);
    if (youngGlyphs_ <= settings_.keptGlyphs.load(std::memory_order_relaxed) / 2) return;
    old_ = std::move(young_);
    young_.clear();
    youngGlyphs_ = 0;
}

ShapedRunPtr ShapeCache::Get(hb_font_t* font, const ShapeRequest& request) {
    uint32_t key[kMaxKey];
    const bool cached = request.count <= kMaxCachedRun;
    const size_t length = cached ? MakeKey(request, LanguageOf(request, settings_), key) : 0;
    const uint64_t hash = HashOf(key, length);
    if (cached) {
        if (ShapedRunPtr found = Find(hash, key, length)) return found;
    }
    ScratchPtr scratch = TakeScratch();
    Shape(font, request, *scratch);
    const Vector<UnitGlyph>& glyphs = scratch->glyphs;
    ShapedRunPtr run(ShapedRun::Create(key, length, glyphs.data(), glyphs.size()));
    ReturnScratch(std::move(scratch));
    if (cached) Insert(hash, run);
    return run;
}

}  // namespace fresco
