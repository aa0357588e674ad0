#include "fresco/cpu/replay.h"

#include "fresco/commands/capture.h"
#include "fresco/cpu/cpu_backend.h"

namespace fresco::cpu {
namespace {

// Pictures of a file together: what a hostile one may make us hold.
constexpr uint64_t kMaxCapturePixels = uint64_t(1) << 28;

bool Restore(const CaptureChunk& chunk, SharedState& state, PixelBuffer* picture, const char** error) {
    const uint32_t* f = chunk.fields;
    switch (chunk.type) {
        case ChunkType::Target:
            *error = "no memory for the target";
            if (picture->pixels()) {
                *error = "two targets";
                return false;
            }
            if (uint64_t(f[0]) * f[1] * 4 > kMaxImageBytes || !picture->Allocate(int(f[0]), int(f[1])))
                return false;
            std::memcpy(picture->pixels(), chunk.data, chunk.size);
            return true;
        case ChunkType::Font:
            *error = "a font does not load";
            return state.fonts.LoadFaceAs(f[0], chunk.data, chunk.size, f[1], SdfMode(f[2]));
        case ChunkType::Pictures: {
            *error = "a font does not load";
            CapturedPictureFont font;
            const bool sound = font.Read(chunk);
            return sound && state.fonts.RegisterBitmapFontAs(
                                f[0], font.table, {"", f[1], font.pages.data(), uint32_t(font.pages.size())});
        }
        case ChunkType::Image:
            *error = "an image does not load";
            return state.resources.RestoreImage(f[0], f[3], f[1], f[2], chunk.data);
        case ChunkType::Surface:
            *error = "a surface does not load";
            return state.resources.RestoreSurface(f[0], f[1], f[2], chunk.data);
        case ChunkType::Buffer:
            return true;
    }
    return false;
}

}  // namespace

bool ReplayCapture(const void* data, size_t size, PixelBuffer* picture, const char** error) {
    Vector<CaptureChunk> chunks;
    if (!ReadCapture(data, size, &chunks, error)) return false;
    std::unique_ptr<SharedState, HeapDeleter<SharedState>> state(HeapNew<SharedState>());
    uint64_t pixels = 0;
    for (const CaptureChunk& chunk : chunks) {
        if (chunk.type != ChunkType::Font && chunk.type != ChunkType::Buffer) pixels += chunk.size / 4;
        *error = "more pixels than a frame can hold";
        if (pixels > kMaxCapturePixels || !Restore(chunk, *state, picture, error)) return false;
    }
    *error = "no render target in the file";
    if (!picture->pixels()) return false;
    CpuBackend backend(*state);
    backend.SetRenderTarget(picture->View(0, 0));
    for (const CaptureChunk& chunk : chunks) {
        if (chunk.type != ChunkType::Buffer) continue;
        CapturedStream stream;
        if (!stream.Read(chunk, error)) return false;
        backend.Execute(stream);
    }
    *error = nullptr;
    return true;
}

}  // namespace fresco::cpu
