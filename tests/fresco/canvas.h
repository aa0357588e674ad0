// A scene with a surface to draw on, as a client would set it up.
#pragma once
#include <malloc.h>

#include <cstring>
#include <string>
#include <vector>

#include <fresco/library.h>
#include <fresco/rendering_library.h>

namespace fresco::test {

// Counts what is out, so that each test also shows that nothing leaks past the client's allocator.
class CountingAllocator final : public IAllocator {
  public:
    void* Allocate(size_t size, size_t alignment) override {
        ++live;
        ++total;
        alignment = std::max<size_t>(alignment, 16);
        void* block = std::aligned_alloc(alignment, (size + alignment - 1) / alignment * alignment);
        const long now = bytes += long(malloc_usable_size(block));
        for (long before = peak; now > before && !peak.compare_exchange_weak(before, now);) {
        }
        return block;
    }
    void Deallocate(void* block, size_t) override {
        if (!block) return;
        --live;
        bytes -= long(malloc_usable_size(block));
        std::free(block);
    }
    std::atomic<long> live{0}, total{0}, bytes{0}, peak{0};
};

class LogLines final : public Logging::ILogHandler {
  public:
    void WriteLog(Logging::Severity, const char* text, size_t length) override {
        lines.emplace_back(text, length);
    }
    std::vector<std::string> lines;
};

class MemoryReader final : public IStreamReader {
  public:
    explicit MemoryReader(std::vector<uint8_t> bytes) : bytes_(std::move(bytes)) {}
    size_t GetSize() override { return bytes_.size(); }
    size_t Read(size_t offset, void* destination, size_t size) override {
        size = offset < bytes_.size() ? std::min(size, bytes_.size() - offset) : 0;
        std::memcpy(destination, bytes_.data() + offset, size);
        return size;
    }
    void Close() override {}

  private:
    std::vector<uint8_t> bytes_;
};

inline constexpr char kSans[] = "/usr/share/fonts/truetype/dejavu/DejaVuSans.ttf";

std::vector<uint8_t> ReadFile(const std::string& path);

struct GlyphSink final : IShapeSink {
    void OnGlyphs(const ShapedGlyph* list, size_t count) override { glyphs.assign(list, list + count); }
    std::vector<ShapedGlyph> glyphs;
};

struct Pixel {
    int r, g, b, a;
    bool operator==(const Pixel&) const = default;
};

class Canvas {
  public:
    explicit Canvas(int width = 64, int height = 64);
    ~Canvas();
    Canvas(const Canvas&) = delete;

    // Runs the buffer on the target and releases it.
    void Draw(CommandBuffer* buffer);
    Pixel At(int x, int y) const;
    FontId LoadFont(const std::string& path);
    // The sum of all pixels' alpha.
    long Ink() const;

    CountingAllocator allocator;
    LogLines log;
    IRenderingLibrary* library = nullptr;
    IScene* scene = nullptr;
    int width, height;
    std::vector<uint32_t> pixels;
    CpuRenderTarget target;
};

inline CommandBuffer* Buffer() {
    return Library::CreateBuffer(0, 0);
}

inline Paint Solid(float r, float g, float b, float a = 1) {
    Paint paint;
    paint.color = {r, g, b, a};
    return paint;
}

}  // namespace fresco::test
