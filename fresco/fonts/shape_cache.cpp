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
// Buffers that wait for the next run; one for each thread that shapes at once.
constexpr size_t kKeptBuffers = 4;

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
    for (size_t i = 0; i < length; ++i)
        hash = (hash ^ key[i]) * 0xD6E8FEB86659FD93ull, hash ^= hash >> 32;
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

// The end of the item that starts at `first`: characters without a script of their own join what is before.
size_t ScriptItemEnd(const uint32_t* codes, size_t first, size_t end, hb_script_t* script) {
    hb_unicode_funcs_t* unicode = hb_unicode_funcs_get_default();
    *script = HB_SCRIPT_INVALID;
    for (size_t i = first; i < end; ++i) {
        const hb_script_t own = hb_unicode_script(unicode, codes[i]);
        if (!HasOwnScript(own)) continue;
        if (*script == HB_SCRIPT_INVALID)
            *script = own;
        else if (RuleScript(own) != RuleScript(*script))
            return i;
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

ShapeCache::~ShapeCache() {
    for (hb_buffer_t* buffer : buffers_)
        hb_buffer_destroy(buffer);
}

hb_buffer_t* ShapeCache::TakeBuffer() {
    {
        std::lock_guard lock(mutex_);
        if (!buffers_.empty()) {
            hb_buffer_t* buffer = buffers_.back();
            buffers_.pop_back();
            return buffer;
        }
    }
    return hb_buffer_create();
}

void ShapeCache::ReturnBuffer(hb_buffer_t* buffer) {
    // One large text must not hold its memory for ever.
    constexpr unsigned kLargeBuffer = 16 * 1024;
    const bool keep = hb_buffer_get_length(buffer) <= kLargeBuffer;
    {
        std::lock_guard lock(mutex_);
        if (keep && buffers_.size() < kKeptBuffers) {
            buffers_.push_back(buffer);
            return;
        }
    }
    hb_buffer_destroy(buffer);
}

void ShapeCache::Shape(hb_font_t* font, const ShapeRequest& request, Vector<UnitGlyph>* out) {
    const Text text(request);
    const bool backward = request.direction == TextDirection::RightToLeft;
    const hb_direction_t direction = backward ? HB_DIRECTION_RTL : HB_DIRECTION_LTR;
    const hb_language_t language = LanguageOf(request, settings_);
    hb_buffer_t* buffer = TakeBuffer();
    const size_t end = text.offset + text.count;
    if (request.script) {
        ShapeItem(font, text, text.offset, end, hb_script_from_iso15924_tag(request.script), direction,
                  language, buffer, out);
    } else {
        struct Item {
            size_t first, end;
            hb_script_t script;
        };
        Vector<Item> items;
        for (size_t first = text.offset; first < end; first = items.back().end) {
            hb_script_t script = HB_SCRIPT_INVALID;
            const size_t itemEnd = ScriptItemEnd(text.codes, first, end, &script);
            items.push_back({first, itemEnd, script});
        }
        // In visual order, which for a backward run begins with its last item.
        if (backward) std::reverse(items.begin(), items.end());
        for (const Item& item : items)
            ShapeItem(font, text, item.first, item.end, item.script, direction, language, buffer, out);
    }
    ReturnBuffer(buffer);
}

ShapedRunPtr ShapeCache::Find(uint64_t hash, const uint32_t* key, size_t length) {
    const auto holds = [&](const ShapedRun& run) {
        return run.key.size() == length && std::memcmp(run.key.data(), key, length * sizeof(uint32_t)) == 0;
    };
    std::lock_guard lock(mutex_);
    if (const auto found = young_.find(hash); found != young_.end())
        return holds(*found->second) ? found->second : nullptr;
    const auto found = old_.find(hash);
    if (found == old_.end() || !holds(*found->second)) return nullptr;
    ShapedRunPtr run = std::move(found->second);
    old_.erase(found);
    youngGlyphs_ += run->glyphs.size();
    young_[hash] = run;
    return run;
}

void ShapeCache::Insert(uint64_t hash, ShapedRunPtr run) {
    std::lock_guard lock(mutex_);
    youngGlyphs_ += run->glyphs.size();
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
    auto run = std::allocate_shared<ShapedRun>(StdAllocator<ShapedRun>());
    Shape(font, request, &run->glyphs);
    if (cached) {
        run->key.assign(key, key + length);
        Insert(hash, run);
    }
    return run;
}

}  // namespace fresco
