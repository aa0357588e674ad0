// Shaped runs of one face, by their text. Results are kept in font units, so that a run is shaped once for
// all sizes. Any thread.
#pragma once
#include <atomic>
#include <cstring>
#include <memory>
#include <mutex>

#include <fresco/font.h>
#include "fresco/core/heap.h"

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

// A run with the key that it is found by, in one block. Immutable and counted: it may leave the cache while a
// thread still reads it.
class ShapedRun {
  public:
    static ShapedRun* Create(const uint32_t* key, size_t keyLength, const UnitGlyph* glyphs, size_t count);
    void AddRef() const { references_.fetch_add(1, std::memory_order_relaxed); }
    void Release() const;

    bool HasKey(const uint32_t* key, size_t length) const {
        return keyLength_ == length && std::memcmp(Words(), key, length * sizeof(uint32_t)) == 0;
    }
    size_t Count() const { return count_; }
    // In visual order.
    const UnitGlyph* Glyphs() const { return reinterpret_cast<const UnitGlyph*>(Words() + keyLength_); }

  private:
    ShapedRun(size_t keyLength, size_t count) : keyLength_(uint32_t(keyLength)), count_(uint32_t(count)) {}
    uint32_t* Words() { return reinterpret_cast<uint32_t*>(this + 1); }
    const uint32_t* Words() const { return reinterpret_cast<const uint32_t*>(this + 1); }

    mutable std::atomic<uint32_t> references_{1};
    uint32_t keyLength_, count_;
};

// Holds one count of a run.
class ShapedRunPtr {
  public:
    ShapedRunPtr() = default;
    // Takes over the count that a new run has.
    explicit ShapedRunPtr(const ShapedRun* run) : run_(run) {}
    ShapedRunPtr(const ShapedRunPtr& other) : run_(other.run_) {
        if (run_) run_->AddRef();
    }
    ShapedRunPtr(ShapedRunPtr&& other) noexcept : run_(std::exchange(other.run_, nullptr)) {}
    ShapedRunPtr& operator=(ShapedRunPtr other) noexcept {
        std::swap(run_, other.run_);
        return *this;
    }
    ~ShapedRunPtr() {
        if (run_) run_->Release();
    }
    explicit operator bool() const { return run_; }
    const ShapedRun* operator->() const { return run_; }

  private:
    const ShapedRun* run_ = nullptr;
};

class ShapeCache {
  public:
    // Longer runs are shaped each time: they are paragraphs, which rarely come twice.
    static constexpr size_t kMaxCachedRun = 512;

    explicit ShapeCache(const ShapeSettings& settings);
    ~ShapeCache();
    ShapeCache(const ShapeCache&) = delete;
    ShapeCache& operator=(const ShapeCache&) = delete;

    ShapedRunPtr Get(hb_font_t* font, const ShapeRequest& request);

  private:
    using Runs = HashMap<uint64_t, ShapedRunPtr>;

    ShapedRunPtr Find(uint64_t hash, const uint32_t* key, size_t length);
    void Insert(uint64_t hash, ShapedRunPtr run);
    // What one shaping works in; kept for the next one.
    struct Scratch;
    using ScratchPtr = std::unique_ptr<Scratch, HeapDeleter<Scratch>>;
    void Shape(hb_font_t* font, const ShapeRequest& request, Scratch& scratch) const;
    ScratchPtr TakeScratch();
    void ReturnScratch(ScratchPtr scratch);

    const ShapeSettings& settings_;
    std::mutex mutex_;
    // Two generations: when the young one is full it becomes the old one, whose runs come back as they are
    // asked for. That keeps what is in use without a list that every hit would have to reorder.
    Runs young_, old_;
    size_t youngGlyphs_ = 0;
    Vector<ScratchPtr> scratch_;
};

}  // namespace fresco
