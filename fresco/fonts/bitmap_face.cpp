#include "fresco/fonts/bitmap_face.h"

#include <algorithm>
#include <charconv>

#include "fresco/core/log.h"

namespace fresco {
namespace {

// All of Unicode's first plane; a table that claims more is not meant for this.
constexpr size_t kMaxCharacters = 65535;
constexpr size_t kMaxKernings = 65536;
constexpr uint32_t kMaxPageSide = 8192;
constexpr uint32_t kMaxPages = 256;
// Offsets, sizes and advances beyond this are a broken table.
constexpr int32_t kMaxValue = 32767;

// The value of `name` in a line of name=value pairs; `fallback` when it is not there or no number.
int32_t Number(std::string_view line, std::string_view name, int32_t fallback) {
    for (size_t at = line.find(name); at != std::string_view::npos; at = line.find(name, at + 1)) {
        const size_t value = at + name.size();
        const bool whole = (at == 0 || line[at - 1] == ' ' || line[at - 1] == '\t') && value < line.size() &&
                           line[value] == '=';
        if (!whole) continue;
        int32_t number = 0;
        const auto [end, fault] = std::from_chars(line.data() + value + 1, line.data() + line.size(), number);
        if (fault != std::errc()) return fallback;
        return std::clamp(number, -kMaxValue, kMaxValue);
    }
    return fallback;
}

// Code points do not fit the limit of the other values.
bool Code(std::string_view line, std::string_view name, uint32_t* code) {
    const size_t at = line.find(name);
    if (at == std::string_view::npos) return false;
    const char* begin = line.data() + at + name.size();
    return std::from_chars(begin, line.data() + line.size(), *code).ec == std::errc() && *code <= 0x10FFFF;
}

bool StartsWith(std::string_view line, std::string_view word) {
    return line.size() > word.size() && line.substr(0, word.size()) == word && line[word.size()] == ' ';
}

}  // namespace

bool BitmapFace::Load(std::string_view table, const BitmapFontDescription& description, FontId id) {
    // Captures write it out again.
    data_ = MakeFontData(Vector<uint8_t>(table.begin(), table.end()));
    id_ = id;
    family_ = description.family ? description.family : "";
    flags_ = description.flags;
    hasColor_ = true;
    unitsPerEm_ = 0;
    if (!TakePages(description)) return false;
    while (!table.empty()) {
        const size_t end = std::min(table.find('\n'), table.size());
        ReadLine(table.substr(0, end));
        table.remove_prefix(std::min(end + 1, table.size()));
    }
    std::stable_sort(characters_.begin(), characters_.end(),
                     [](const Character& a, const Character& b) { return a.code < b.code; });
    const auto same = [](const Character& a, const Character& b) { return a.code == b.code; };
    characters_.erase(std::unique(characters_.begin(), characters_.end(), same), characters_.end());
    if (characters_.empty()) {
        FRESCO_WARN("The glyph table of the bitmap font %s has no characters", family_.c_str());
        return false;
    }
    if (!(unitsPerEm_ > 0)) unitsPerEm_ = lineHeight_ > 0 ? lineHeight_ : 16;
    if (!(lineHeight_ > 0)) lineHeight_ = unitsPerEm_;
    return true;
}

bool BitmapFace::TakePages(const BitmapFontDescription& description) {
    const bool counts = description.images && description.imageCount > 0;
    for (uint32_t i = 0; counts && i < std::min(description.imageCount, kMaxPages); ++i) {
        const BitmapFontImage& image = description.images[i];
        const bool usable = image.pixels && image.width > 0 && image.height > 0 &&
                            image.width <= kMaxPageSide && image.height <= kMaxPageSide &&
                            image.rowPitch / 4 >= image.width;
        if (!usable) {
            FRESCO_WARN("Page %u of the bitmap font %s is not usable", i, family_.c_str());
            return false;
        }
        Page page;
        page.width = image.width, page.height = image.height;
        page.pixels.resize(size_t(image.width) * image.height);
        for (uint32_t y = 0; y < image.height; ++y) {
            std::copy_n(static_cast<const uint8_t*>(image.pixels) + size_t(y) * image.rowPitch,
                        size_t(image.width) * 4,
                        reinterpret_cast<uint8_t*>(page.pixels.data() + size_t(y) * image.width));
        }
        pages_.push_back(std::move(page));
    }
    return !pages_.empty();
}

Vector<BitmapFontImage> BitmapFace::GetPages() const {
    Vector<BitmapFontImage> pages;
    for (const Page& page : pages_)
        pages.push_back({page.pixels.data(), page.width, page.height, page.width * 4});
    return pages;
}

void BitmapFace::ReadLine(std::string_view line) {
    if (StartsWith(line, "char")) {
        Character character{};
        if (characters_.size() == kMaxCharacters || !Code(line, " id=", &character.code)) return;
        character.x = Number(line, "x", 0), character.y = Number(line, "y", 0);
        character.width = Number(line, "width", 0), character.height = Number(line, "height", 0);
        character.offsetX = Number(line, "xoffset", 0), character.offsetY = Number(line, "yoffset", 0);
        character.advance = std::max(Number(line, "xadvance", character.width), 0);
        character.page = uint32_t(std::max(Number(line, "page", 0), 0));
        characters_.push_back(character);
    } else if (StartsWith(line, "kerning")) {
        uint32_t first = 0, second = 0;
        if (kernings_.size() == kMaxKernings || !Code(line, " first=", &first) ||
            !Code(line, " second=", &second)) {
            return;
        }
        kernings_[uint64_t(first) << 32 | second] = Number(line, "amount", 0);
    } else if (StartsWith(line, "common")) {
        lineHeight_ = float(Number(line, "lineHeight", 0));
        base_ = float(Number(line, "base", 0));
    } else if (StartsWith(line, "info")) {
        // Negative where the size was matched against the height of a character.
        unitsPerEm_ = float(std::abs(Number(line, "size", 0)));
    }
}

void BitmapFace::GetGlyphIndices(const uint32_t* codePoints, size_t count, uint32_t* glyphs) const {
    for (size_t i = 0; i < count; ++i) {
        const auto found =
            std::lower_bound(characters_.begin(), characters_.end(), codePoints[i],
                             [](const Character& character, uint32_t code) { return character.code < code; });
        const bool has = found != characters_.end() && found->code == codePoints[i];
        glyphs[i] = has ? uint32_t(found - characters_.begin()) + 1 : 0;
    }
}

FontMetrics BitmapFace::GetMetrics(float size) const {
    if (!IsValidFontSize(size)) return {};
    const float scale = size / unitsPerEm_;
    const float thickness = size / 14;
    return {-base_ * scale,       (lineHeight_ - base_) * scale, 0, thickness, thickness,
            base_ * 0.5f * scale, base_ * 0.7f * scale};
}

bool BitmapFace::GetAdvances(const uint32_t* glyphs, size_t count, float size, float* advances) const {
    bool valid = IsValidFontSize(size);
    const float scale = size / unitsPerEm_;
    for (size_t i = 0; valid && i < count; ++i) {
        valid = glyphs[i] <= characters_.size();
        // The glyph 0 is a blank of half an em.
        if (valid) {
            advances[i] = glyphs[i] == 0 ? size / 2 : float(characters_[glyphs[i] - 1].advance) * scale;
        }
    }
    if (!valid) std::fill_n(advances, count, 0.0f);
    return valid;
}

int32_t BitmapFace::Kerning(uint32_t first, uint32_t second) const {
    const auto found = kernings_.find(uint64_t(first) << 32 | second);
    return found == kernings_.end() ? 0 : found->second;
}

bool BitmapFace::Shape(const ShapeRequest& request, IShapeSink& sink) const {
    if (request.count == 0 || request.count > 1u << 24 || !IsValidFontSize(request.size)) return false;
    const float scale = request.size / unitsPerEm_;
    Vector<ShapedGlyph> glyphs(request.count);
    for (size_t i = 0; i < request.count; ++i) {
        ShapedGlyph& glyph = glyphs[i];
        GetGlyphIndices(request.codePoints + i, 1, &glyph.index);
        GetAdvances(&glyph.index, 1, request.size, &glyph.advance);
        glyph.cluster = uint32_t(i);
        if (i > 0) {
            glyphs[i - 1].advance += float(Kerning(request.codePoints[i - 1], request.codePoints[i])) * scale;
        }
    }
    if (request.direction == TextDirection::RightToLeft) std::reverse(glyphs.begin(), glyphs.end());
    sink.OnGlyphs(glyphs.data(), glyphs.size());
    return true;
}

void BitmapFace::PreloadGlyphs(const uint32_t* codePoints, size_t count) const {
    for (size_t i = 0; i < count; ++i) {
        uint32_t glyph = 0;
        GetGlyphIndices(codePoints + i, 1, &glyph);
        if (glyph) GetColorGlyph(glyph);
    }
}

const ColorGlyph* BitmapFace::GetColorGlyph(uint32_t glyph) const {
    if (glyph == 0 || glyph > characters_.size()) return nullptr;
    std::lock_guard lock(mutex_);
    auto& slot = pictures_[glyph];
    if (!slot) {
        slot.reset(HeapNew<ColorGlyph>());
        if (!slot) HeapExhausted(sizeof(ColorGlyph));
        Cut(characters_[glyph - 1], *slot);
    }
    return slot->pixels.empty() ? nullptr : slot.get();
}

void BitmapFace::Cut(const Character& character, ColorGlyph& out) const {
    if (character.page >= pages_.size()) return;
    const Page& page = pages_[character.page];
    const int32_t left = std::max(character.x, 0), top = std::max(character.y, 0);
    const int32_t right = std::min(character.x + character.width, int32_t(page.width));
    const int32_t bottom = std::min(character.y + character.height, int32_t(page.height));
    if (right <= left || bottom <= top) return;
    out.width = uint32_t(right - left), out.height = uint32_t(bottom - top);
    out.left = float(character.offsetX) / unitsPerEm_;
    out.top = (float(character.offsetY) - base_) / unitsPerEm_;
    out.emWidth = float(out.width) / unitsPerEm_, out.emHeight = float(out.height) / unitsPerEm_;
    out.tinted = true;
    out.pixels.resize(size_t(out.width) * out.height);
    for (uint32_t y = 0; y < out.height; ++y) {
        std::copy_n(page.pixels.data() + size_t(top + int32_t(y)) * page.width + left, out.width,
                    out.pixels.data() + size_t(y) * out.width);
    }
}

}  // namespace fresco
