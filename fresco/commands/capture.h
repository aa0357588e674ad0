// Capture files: recorded buffers with everything they start from, in one piece of memory.
//
// Layout, little-endian: CaptureHeader, then chunks. A chunk is a ChunkHeader, its fixed fields, its data,
// and zeros up to the next 8 bytes:
//   Target   width, height                             rows of the render target before the frame
//   Font     id, face index, SDF mode                  the font file
//   Pictures id, flag word, page count, table size     the glyph table, padded to 4, then each page: uint32
//   width, height, rows (a font of pictures) Image    id, width, height, PixelFormat            rows without
//   gaps, RGBA8 premultiplied or A8 Surface  id, width, height                         rows Buffer   target
//   surface, stream size, blob count   the stream, then each blob: uint32 size, bytes, padded to 4
// Buffers run in the order in which they stand. A reader trusts nothing: ReadCapture checks each number
// before it uses it, and each stream with ValidateStream.
#pragma once
#include <string_view>

#include <fresco/font.h>
#include "fresco/backend/backend.h"
#include "fresco/core/heap.h"

namespace fresco {

constexpr uint32_t kCaptureMagic = 0x43535246;  // "FRSC"
constexpr uint32_t kCaptureVersion = 1;

struct CaptureHeader {
    uint32_t magic = kCaptureMagic;
    uint32_t version = kCaptureVersion;
    uint32_t streamVersion = kStreamVersion;
    uint32_t chunkCount = 0;
};

enum class ChunkType : uint32_t { Target = 1, Font, Image, Surface, Buffer, Pictures };

struct ChunkHeader {
    uint32_t type = 0;
    uint32_t fields[4] = {};
    uint32_t reserved = 0;
    uint64_t size = 0;  // of the data, without the padding
};

class CaptureWriter {
  public:
    CaptureWriter();
    void AddTarget(uint32_t width, uint32_t height, const uint8_t* rows, size_t pitch);
    void AddFont(FontId id, uint32_t faceIndex, uint32_t sdf, const void* data, size_t size);
    void AddPictureFont(FontId id, std::string_view table, const BitmapFontDescription& font);
    void AddImage(ImageId id, uint32_t width, uint32_t height, uint32_t format, const void* pixels);
    void AddSurface(SurfaceId id, uint32_t width, uint32_t height, const void* pixels);
    void AddBuffer(const StreamSource& stream);
    const Vector<uint8_t>& Finish();

  private:
    size_t BeginChunk(ChunkType type, uint32_t a, uint32_t b, uint32_t c, uint32_t d);
    void EndChunk(size_t start);
    void Append(const void* data, size_t size);

    Vector<uint8_t> data_;
    uint32_t chunks_ = 0;
};

// A chunk of a file that has been checked; pointers go into the file.
struct CaptureChunk {
    ChunkType type;
    uint32_t fields[4];
    const uint8_t* data;
    size_t size;
};

// A chunk of a font of pictures: its glyph table and its pages, which point into the file.
struct CapturedPictureFont {
    std::string_view table;
    Vector<BitmapFontImage> pages;
    // False when it is cut short.
    bool Read(const CaptureChunk& chunk);
};

// A buffer chunk as a stream.
class CapturedStream final : public StreamSource {
  public:
    bool Read(const CaptureChunk& chunk, const char** error);
    const void* GetData() const override { return stream_; }
    size_t GetSize() const override { return streamSize_; }
    SurfaceId GetTarget() const override { return target_; }
    const void* GetPixels(uint32_t index, size_t* size) const override;

  private:
    struct Blob {
        const uint8_t* data;
        size_t size;
    };
    const uint8_t* stream_ = nullptr;
    size_t streamSize_ = 0;
    SurfaceId target_ = kNoId;
    Vector<Blob> blobs_;
};

// False with a one-line reason when the file is no capture of this version, is cut or lies. `data` must be
// aligned to 8 bytes.
bool ReadCapture(const void* data, size_t size, Vector<CaptureChunk>* chunks, const char** error);

// Which ids a stream draws with but did not make itself.
struct StreamUses {
    Vector<ImageId> images;
    Vector<SurfaceId> surfaces;
    Vector<FontId> fonts;
};
void CollectUses(const StreamSource& stream, StreamUses* uses);

}  // namespace fresco
