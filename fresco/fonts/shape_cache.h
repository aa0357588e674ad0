// Shaped runs of one face, by their text. Results are kept in font units, so that a run is shaped once for
// all sizes. Any thread.
#pragma once
#include <atomic>
#include <memory>
#include <mutex>

#include <fresco/font.h>
#include "fresco/core/heap.h"

struct hb_buffer_t;
struct hb_font_t;
struct hb_language_impl_t;

namespace fresco {

// What IFontService::Configure sets for all faces.
struct ShapeSettings {
    static constexpr uint32_t kDefaultGlyphs = 32 * 1024;
    std::atomic<const hb_language_impl_t*> language{nullptr};
    std::atomic<uint32_t> keptGlyphs{kDefaultGlyphs};
};

struct UnitGlyph {
    uint32_t index;
    uint32_t cluster;
    int32_t advance, x, y;
};

struct ShapedRun {
    Vector<uint32_t> key;
    Vector<UnitGlyph> glyphs;  // in visual order
};
using ShapedRunPtr = std::shared_ptr<const ShapedRun>;

class ShapeCache {
  public:
    // Longer runs are shaped each time: they are paragraphs, which rarely come twice.
    static constexpr size_t kMaxCachedRun = 512;

    explicit ShapeCache(const ShapeSettings& settings) : settings_(settings) {}
    ~ShapeCache();
    ShapeCache(const ShapeCache&) = delete;
    ShapeCache& operator=(const ShapeCache&) = delete;

    ShapedRunPtr Get(hb_font_t* font, const ShapeRequest& request);

  private:
    using Runs = HashMap<uint64_t, ShapedRunPtr>;

    ShapedRunPtr Find(uint64_t hash, const uint32_t* key, size_t length);
    void Insert(uint64_t hash, ShapedRunPtr run);
    void Shape(hb_font_t* font, const ShapeRequest& request, Vector<UnitGlyph>* out);
    hb_buffer_t* TakeBuffer();
    void ReturnBuffer(hb_buffer_t* buffer);

    const ShapeSettings& settings_;
    std::mutex mutex_;
    // Two generations: when the young one is full it becomes the old one, whose runs come back as they are
    // asked for. That keeps what is in use without a list that every hit would have to reorder.
    Runs young_, old_;
    size_t youngGlyphs_ = 0;
    Vector<hb_buffer_t*> buffers_;
};

}  // namespace fresco
