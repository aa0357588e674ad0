#include "fresco/commands/capture.h"

#include "fresco/commands/validate.h"

namespace fresco {

CaptureWriter::CaptureWriter() {
    const CaptureHeader header;
    Append(&header, sizeof(header));
}

void CaptureWriter::Append(const void* data, size_t size) {
    const auto* bytes = static_cast<const uint8_t*>(data);
    data_.insert(data_.end(), bytes, bytes + size);
}

size_t CaptureWriter::BeginChunk(ChunkType type, uint32_t a, uint32_t b, uint32_t c, uint32_t d) {
    const size_t start = data_.size();
    const ChunkHeader header{uint32_t(type), {a, b, c, d}, 0, 0};
    Append(&header, sizeof(header));
    ++chunks_;
    return start;
}

void CaptureWriter::EndChunk(size_t start) {
    const uint64_t size = data_.size() - start - sizeof(ChunkHeader);
    std::memcpy(data_.data() + start + offsetof(ChunkHeader, size), &size, sizeof(size));
    data_.resize((data_.size() + 7) & ~size_t(7));
}

void CaptureWriter::AddTarget(uint32_t width, uint32_t height, const uint8_t* rows, size_t pitch) {
    const size_t start = BeginChunk(ChunkType::Target, width, height, 0, 0);
    for (uint32_t y = 0; y < height; ++y)
        Append(rows + y * pitch, size_t(width) * 4);
    EndChunk(start);
}

void CaptureWriter::AddFont(FontId id, uint32_t faceIndex, uint32_t sdf, const void* data, size_t size) {
    const size_t start = BeginChunk(ChunkType::Font, id, faceIndex, sdf, 0);
    Append(data, size);
    EndChunk(start);
}

void CaptureWriter::AddPictureFont(FontId id, std::string_view table, const BitmapFontDescription& font) {
    const size_t start =
        BeginChunk(ChunkType::Pictures, id, font.flags, font.imageCount, uint32_t(table.size()));
    Append(table.data(), table.size());
    data_.resize((data_.size() + 3) & ~size_t(3));
    for (uint32_t i = 0; i < font.imageCount; ++i) {
        const BitmapFontImage& page = font.images[i];
        Append(&page.width, sizeof(page.width));
        Append(&page.height, sizeof(page.height));
        for (uint32_t y = 0; y < page.height; ++y)
            Append(static_cast<const uint8_t*>(page.pixels) + size_t(y) * page.rowPitch,
                   size_t(page.width) * 4);
    }
    EndChunk(start);
}

void CaptureWriter::AddImage(ImageId id, uint32_t width, uint32_t height, uint32_t format,
                             const void* pixels) {
    const size_t start = BeginChunk(ChunkType::Image, id, width, height, format);
    Append(pixels, size_t(width) * height * (format == uint32_t(PixelFormat::A8) ? 1 : 4));
    EndChunk(start);
}

void CaptureWriter::AddSurface(SurfaceId id, uint32_t width, uint32_t height, const void* pixels) {
    const size_t start = BeginChunk(ChunkType::Surface, id, width, height, 0);
    Append(pixels, size_t(width) * height * 4);
    EndChunk(start);
}

void CaptureWriter::AddBuffer(const StreamSource& stream) {
    uint32_t blobs = 0;
    while (stream.GetPixels(blobs, nullptr))
        ++blobs;
    const size_t start =
        BeginChunk(ChunkType::Buffer, stream.GetTarget(), uint32_t(stream.GetSize()), blobs, 0);
    const size_t streamStart = data_.size();
    Append(stream.GetData(), stream.GetSize());
    // A client's image object is written as the pixels it shows now.
    struct Replacement {
        uint32_t blob;
        uint32_t width, height, format;
    };
    Vector<Replacement> users;
    for (size_t at = streamStart; at < data_.size();) {
        auto& header = *reinterpret_cast<RecordHeader*>(data_.data() + at);
        if (header.type == uint32_t(CommandType::CreateImage)) {
            auto& record = *reinterpret_cast<CreateImageRecord*>(data_.data() + at + sizeof(RecordHeader));
            if (record.flags & kImageUserObject) {
                record.flags &= ~uint32_t(kImageUserObject);
                record.pixels.rowPitch = 0;
                users.push_back({record.pixels.index, record.width, record.height, record.format});
            }
        }
        at += header.size;
    }
    for (uint32_t i = 0; i < blobs; ++i) {
        size_t size = 0;
        const void* pixels = stream.GetPixels(i, &size);
        Vector<uint8_t> rows;
        for (const Replacement& user : users) {
            if (user.blob != i) continue;
            const auto& image = *static_cast<const UserImage*>(pixels);
            const size_t row = size_t(user.width) * (user.format == uint32_t(PixelFormat::A8) ? 1 : 4);
            rows.resize(row * user.height);
            for (uint32_t y = 0; image.pixels && y < user.height; ++y) {
                const size_t pitch = image.rowPitch ? image.rowPitch : row;
                std::memcpy(rows.data() + y * row, static_cast<const uint8_t*>(image.pixels) + y * pitch,
                            row);
            }
            pixels = rows.data(), size = rows.size();
            break;
        }
        const uint32_t blobSize = uint32_t(size);
        Append(&blobSize, sizeof(blobSize));
        Append(pixels, size);
        data_.resize((data_.size() + 3) & ~size_t(3));
    }
    EndChunk(start);
}

const Vector<uint8_t>& CaptureWriter::Finish() {
    std::memcpy(data_.data() + offsetof(CaptureHeader, chunkCount), &chunks_, sizeof(chunks_));
    return data_;
}

bool CapturedPictureFont::Read(const CaptureChunk& chunk) {
    const uint64_t tableSize = (uint64_t(chunk.fields[3]) + 3) & ~uint64_t(3);
    if (tableSize > chunk.size) return false;
    table = {reinterpret_cast<const char*>(chunk.data), chunk.fields[3]};
    size_t at = size_t(tableSize);
    for (uint32_t i = 0; i < chunk.fields[2]; ++i) {
        uint32_t side[2];
        if (chunk.size - at < sizeof(side)) return false;
        std::memcpy(side, chunk.data + at, sizeof(side));
        at += sizeof(side);
        if (side[0] > kMaxImageSide || side[1] > kMaxImageSide) return false;
        const uint64_t bytes = uint64_t(side[0]) * side[1] * 4;
        if (bytes > chunk.size - at) return false;
        pages.push_back({chunk.data + at, side[0], side[1], side[0] * 4});
        at += size_t(bytes);
    }
    return true;
}

bool CapturedStream::Read(const CaptureChunk& chunk, const char** error) {
    target_ = chunk.fields[0];
    stream_ = chunk.data;
    streamSize_ = chunk.fields[1];
    size_t left = chunk.size;
    *error = "a buffer is cut short";
    if (streamSize_ > left) return false;
    const uint8_t* cursor = chunk.data + streamSize_;
    left -= streamSize_;
    for (uint32_t i = 0; i < chunk.fields[2]; ++i) {
        uint32_t size;
        if (left < sizeof(size)) return false;
        std::memcpy(&size, cursor, sizeof(size));
        const uint64_t padded = (uint64_t(size) + 3) & ~uint64_t(3);
        if (padded > left - sizeof(size)) return false;
        blobs_.push_back({cursor + sizeof(size), size});
        cursor += sizeof(size) + padded;
        left -= sizeof(size) + size_t(padded);
    }
    return ValidateStream(stream_, streamSize_, blobs_.size(), error);
}

const void* CapturedStream::GetPixels(uint32_t index, size_t* size) const {
    if (index >= blobs_.size()) return nullptr;
    if (size) *size = blobs_[index].size;
    return blobs_[index].data;
}

namespace {

// Do the chunk's own sizes agree with its data?
const char* CheckChunk(const CaptureChunk& chunk) {
    const auto pixels = [&](uint32_t width, uint32_t height, uint64_t pixelSize) -> const char* {
        if (width == 0 || height == 0 || width > kMaxImageSide || height > kMaxImageSide)
            return "a picture of an impossible size";
        return uint64_t(width) * height * pixelSize == chunk.size ? nullptr : "a picture is cut short";
    };
    switch (chunk.type) {
        case ChunkType::Target:
            return pixels(chunk.fields[0], chunk.fields[1], 4);
        case ChunkType::Image:
            if (chunk.fields[3] > uint32_t(PixelFormat::A8)) return "a picture of an unknown format";
            return pixels(chunk.fields[1], chunk.fields[2],
                          chunk.fields[3] == uint32_t(PixelFormat::A8) ? 1 : 4);
        case ChunkType::Surface:
            return pixels(chunk.fields[1], chunk.fields[2], 4);
        case ChunkType::Font:
            return chunk.size > 0 && chunk.fields[2] <= uint32_t(SdfMode::Never) ? nullptr
                                                                                 : "an invalid font";
        case ChunkType::Pictures:
            return CapturedPictureFont().Read(chunk) ? nullptr : "an invalid font";
        case ChunkType::Buffer: {
            CapturedStream stream;
            const char* error = nullptr;
            return stream.Read(chunk, &error) ? nullptr : error;
        }
    }
    return "a chunk of an unknown type";
}

}  // namespace

bool ReadCapture(const void* data, size_t size, Vector<CaptureChunk>* chunks, const char** error) {
    CaptureHeader header;
    *error = "not a capture file";
    if (size < sizeof(header)) return false;
    std::memcpy(&header, data, sizeof(header));
    if (header.magic != kCaptureMagic) return false;
    *error = "a capture of another version";
    if (header.version != kCaptureVersion || header.streamVersion != kStreamVersion) return false;
    const auto* cursor = static_cast<const uint8_t*>(data) + sizeof(header);
    size_t left = size - sizeof(header);
    for (uint32_t i = 0; i < header.chunkCount; ++i) {
        ChunkHeader chunk;
        *error = "the file is cut short";
        if (left < sizeof(chunk)) return false;
        std::memcpy(&chunk, cursor, sizeof(chunk));
        cursor += sizeof(chunk);
        left -= sizeof(chunk);
        if (chunk.size > left) return false;
        chunks->push_back({ChunkType(chunk.type),
                           {chunk.fields[0], chunk.fields[1], chunk.fields[2], chunk.fields[3]},
                           cursor,
                           size_t(chunk.size)});
        if (const char* reason = CheckChunk(chunks->back())) {
            *error = reason;
            return false;
        }
        const size_t padded = std::min(left, size_t((chunk.size + 7) & ~uint64_t(7)));
        cursor += padded;
        left -= padded;
    }
    *error = nullptr;
    return true;
}

// --- uses
// ----------------------------------------------------------------------------------------------------

namespace {

void AddOnce(Vector<uint32_t>* list, uint32_t id) {
    if (id != kNoId && std::find(list->begin(), list->end(), id) == list->end()) list->push_back(id);
}

// Ids by record; the others use none.
class UseCollector {
  public:
    explicit UseCollector(StreamUses* uses) : uses_(*uses) {}

    template <class Record, class Tail>
    void Visit(const Record& record, const Tail& tail) {
        if constexpr (requires { record.run.font; }) AddOnce(&uses_.fonts, record.run.font);
        if constexpr (requires { record.text.font; }) AddOnce(&uses_.fonts, record.text.font);
        if constexpr (requires { record.image; }) AddOnce(&uses_.images, record.image);
        if constexpr (requires { record.surface; }) AddOnce(&uses_.surfaces, record.surface);
        if constexpr (requires { record.planes; }) {
            for (const ImageId id : record.planes.ids)
                AddOnce(&uses_.images, id);
        }
        if constexpr (std::is_same_v<Tail, EffectsTail>) AddPatterns(tail);
    }
#define FRESCO_USE(name, tail, fields)                              \
    void name(const name##Record& record, const tail##Tail& data) { \
        Visit(record, data);                                        \
    }
    FRESCO_COMMANDS(FRESCO_USE, FRESCO_NO_FIELD)
#undef FRESCO_USE

  private:
    void AddPatterns(const EffectsTail& tail) {
        const uint8_t* cursor = tail.data;
        for (uint32_t i = 0; i < tail.count; ++i) {
            const auto& header = *reinterpret_cast<const EffectHeader*>(cursor);
            if (header.kind == uint32_t(EffectKind::Pattern)) {
                const auto& pattern = *reinterpret_cast<const PatternGeometry*>(cursor + sizeof(header));
                AddOnce(pattern.source == kPatternSurface ? &uses_.surfaces : &uses_.images, pattern.id);
            }
            cursor += sizeof(header) + header.size;
        }
    }
    StreamUses& uses_;
};

}  // namespace

void CollectUses(const StreamSource& stream, StreamUses* uses) {
    UseCollector collector(uses);
    AddOnce(&uses->surfaces, stream.GetTarget());
    DispatchStream(stream.GetData(), stream.GetSize(), collector);
}

}  // namespace fresco
