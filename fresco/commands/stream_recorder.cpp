#include "fresco/commands/stream_recorder.h"

#include <algorithm>
#include <mutex>

#include <fresco/library.h>
#include "fresco/commands/buffer_pool.h"
#include "fresco/commands/finite.h"
#include "fresco/core/log.h"
#include "fresco/core/process.h"
#include "fresco/paths/matrix.h"

namespace fresco {
namespace {

constexpr size_t kDefaultReserve = 1024;
// A single record beyond this is refused; no real path or run comes near it.
constexpr size_t kMaxRecordSize = size_t(1) << 30;

}  // namespace

void StreamRecorder::Begin(SurfaceId target, size_t reserve) {
    stream_.clear();
    states_.clear();
    pixels_.clear();
    stream_.reserve(reserve ? reserve : kDefaultReserve);
    transform_ = Matrix4{};
    renderScale_[0] = renderScale_[1] = 1;
    target_ = target;
    warned_ = false;
}

void StreamRecorder::Refuse(CommandType type) {
    if (warned_) return;
    warned_ = true;
    FRESCO_WARN("Dropping a drawing command with invalid numbers (record type %u)", uint32_t(type));
}

template <class Record>
void StreamRecorder::Append(const Record& record) {
    static_assert(std::is_trivially_copyable_v<Record> && alignof(Record) == 4 && sizeof(Record) % 4 == 0);
    if (!IsFinite(record)) return Refuse(Record::kType);
    constexpr uint32_t kSize = sizeof(RecordHeader) + sizeof(Record);
    uint8_t* out = stream_.Extend(kSize);
    const RecordHeader header{uint32_t(Record::kType), kSize};
    std::memcpy(out, &header, sizeof(header));
    std::memcpy(out + sizeof(header), &record, sizeof(record));
}

// As Append(Record{fields...}), but what a page consists of is written to its place at once: see WordAt.
template <class Record, class... Fields>
void StreamRecorder::AppendFields(const Fields&... fields) {
    static_assert(std::is_trivially_copyable_v<Record> && sizeof(Record) == (sizeof(Fields) + ...));
    static_assert(((sizeof(Fields) % 4 == 0) && ...));
    if (!(IsFinite(fields) && ...)) return Refuse(Record::kType);
    constexpr uint32_t kSize = sizeof(RecordHeader) + sizeof(Record);
    uint8_t* out = stream_.Extend(kSize);
    const RecordHeader header{uint32_t(Record::kType), kSize};
    std::memcpy(out, &header, sizeof(header));
    out += sizeof(header);
    const auto copy = [&out](const auto& field) {
        const auto* from = reinterpret_cast<const uint8_t*>(&field);
        for (size_t i = 0; i < sizeof(field); i += 4) {
            const uint32_t word = WordAt(from + i);
            std::memcpy(out + i, &word, sizeof(word));
        }
        out += sizeof(field);
    };
    (copy(fields), ...);
}

template <class Record>
void StreamRecorder::Append(const Record& record, std::initializer_list<Chunk> tail) {
    static_assert(std::is_trivially_copyable_v<Record> && alignof(Record) == 4);
    if (!IsFinite(record)) return Refuse(Record::kType);
    size_t size = sizeof(RecordHeader) + sizeof(Record);
    for (const Chunk& chunk : tail)
        size += chunk.size;
    const size_t padded = (size + 3) & ~size_t(3);
    if (padded > kMaxRecordSize) return Refuse(Record::kType);
    uint8_t* out = stream_.Extend(padded);
    const RecordHeader header{uint32_t(Record::kType), uint32_t(padded)};
    std::memcpy(out, &header, sizeof(header));
    std::memcpy(out + sizeof(header), &record, sizeof(record));
    out += sizeof(header) + sizeof(record);
    for (const Chunk& chunk : tail) {
        if (chunk.size) std::memcpy(out, chunk.data, chunk.size);
        out += chunk.size;
    }
    if (padded != size) std::memset(out, 0, padded - size);
}

template <class Record>
void StreamRecorder::AppendPath(Record record, const Path& path) {
    const size_t points = path.GetPointCount(), verbs = path.GetVerbCount();
    if (verbs == 0) return;
    if (points > kMaxRecordSize / sizeof(Point)) return Refuse(Record::kType);
    const uint64_t hash = path.GetHash();
    record.path = {uint32_t(verbs), uint32_t(points), uint32_t(path.GetFillRule()), uint32_t(hash),
                   uint32_t(hash >> 32)};
    Append(record, {{path.GetPoints(), points * sizeof(Point)}, {path.GetVerbs(), verbs}});
}

template <class Record>
void StreamRecorder::AppendGlyphs(const Glyph* glyphs, uint32_t count, const GlyphRunParams& params) {
    if (count == 0 || count > kMaxRecordSize / sizeof(Glyph)) return;
    for (uint32_t i = 0; i < count; ++i) {
        if (!AllFinite(&glyphs[i].x, 2)) return Refuse(Record::kType);
    }
    Append(Record{params, count}, {{glyphs, count * sizeof(Glyph)}});
}

template <class Record>
void StreamRecorder::AppendGradient(Record record, const GradientStop* stops, uint32_t count) {
    if (count == 0 || count > kMaxRecordSize / sizeof(GradientStop)) return;
    for (uint32_t i = 0; i < count; ++i) {
        if (!IsFinite(stops[i])) return Refuse(Record::kType);
    }
    record.count = count;
    Append(record, {{stops, count * sizeof(GradientStop)}});
}

// The record has been appended with an empty tail; the effects follow it and its size grows.
void StreamRecorder::AppendEffects(size_t recordStart, const Effect* const* effects, uint32_t count) {
    for (uint32_t i = 0; i < count; ++i) {
        if (!effects[i]) continue;
        const EffectHeader header{uint32_t(effects[i]->GetKind()), Padded(effects[i]->GetDataSize())};
        const size_t size = effects[i]->GetDataSize();
        uint8_t* out = stream_.Extend(sizeof(header) + header.size);
        std::memcpy(out, &header, sizeof(header));
        if (size) std::memcpy(out + sizeof(header), effects[i]->GetData(), size);
        std::memset(out + sizeof(header) + size, 0, header.size - size);
    }
    auto* header = reinterpret_cast<RecordHeader*>(stream_.data() + recordStart);
    header->size = uint32_t(stream_.size() - recordStart);
}

uint32_t StreamRecorder::KeepPixels(const void* data, size_t size) {
    if (!data) return kNoId;
    pixels_.push_back({data, size});
    return uint32_t(pixels_.size() - 1);
}

const void* StreamRecorder::GetPixels(uint32_t index, size_t* size) const {
    if (index >= pixels_.size()) return nullptr;
    if (size) *size = pixels_[index].size;
    return pixels_[index].data;
}

void StreamRecorder::ClearRect(const Rect& rect, uint32_t flag) {
    Append(ClearRectRecord{rect, flag});
}

void StreamRecorder::FillRect(const Rect& rect, const Paint& paint) {
    AppendFields<FillRectRecord>(rect, paint);
}

void StreamRecorder::StrokeRect(const Rect& rect, const Paint& paint) {
    Append(StrokeRectRecord{rect, paint});
}

void StreamRecorder::FillQuad(const Point points[4], const Paint& paint) {
    Append(FillQuadRecord{{{points[0], points[1], points[2], points[3]}}, paint});
}

void StreamRecorder::FillRoundedRect(const Rect& rect, const CornerRadii& radii, const Paint& paint) {
    Append(FillRoundedRectRecord{rect, radii, paint});
}

void StreamRecorder::StrokeRoundedRect(const Rect& rect, const CornerRadii& radii, const Paint& paint) {
    Append(StrokeRoundedRectRecord{rect, radii, paint});
}

void StreamRecorder::FillCircle(float cx, float cy, float z, float radius, const Paint& paint) {
    Append(FillEllipseRecord{{cx, cy, z, radius, radius}, paint});
}

void StreamRecorder::StrokeCircle(float cx, float cy, float z, float radius, const Paint& paint) {
    Append(StrokeEllipseRecord{{cx, cy, z, radius, radius}, paint});
}

void StreamRecorder::FillEllipse(float cx, float cy, float z, float rx, float ry, const Paint& paint) {
    Append(FillEllipseRecord{{cx, cy, z, rx, ry}, paint});
}

void StreamRecorder::StrokeEllipse(float cx, float cy, float z, float rx, float ry, const Paint& paint) {
    Append(StrokeEllipseRecord{{cx, cy, z, rx, ry}, paint});
}

void StreamRecorder::BeginScissor() {
    Append(BeginScissorRecord{});
}

void StreamRecorder::ClipRect(const Rect& rect, uint32_t mode) {
    Append(ClipRectRecord{rect, mode});
}

void StreamRecorder::ClipQuad(const Point3 points[4], uint32_t mode) {
    Append(ClipQuadRecord{{{points[0], points[1], points[2], points[3]}}, mode});
}

void StreamRecorder::ClipRoundedRect(const Rect& rect, const CornerRadii& radii, uint32_t mode) {
    Append(ClipRoundedRectRecord{rect, radii, mode});
}

void StreamRecorder::ClipEllipse(float cx, float cy, float rx, float ry, uint32_t mode) {
    Append(ClipEllipseRecord{{cx, cy, 0, rx, ry}, mode});
}

void StreamRecorder::SetMaskImage(ImageId image, const Rect& dst, const Rect& src, uint32_t mode) {
    Append(SetMaskImageRecord{image, dst, src, mode});
}

void StreamRecorder::SetMaskImageTiled(ImageId image, const Rect& dst, const ImageTile& tile, uint32_t mode) {
    Append(SetMaskImageTiledRecord{image, dst, tile, mode});
}

void StreamRecorder::FillPath(const Path& path, const Paint& paint) {
    AppendPath(FillPathRecord{{}, paint}, path);
}

void StreamRecorder::StrokePath(const Path& path, const Paint& paint, uint32_t flag) {
    AppendPath(StrokePathRecord{{}, paint, flag}, path);
}

void StreamRecorder::ClipPath(const Path& path, uint32_t mode) {
    // A path without commands has no inside.
    if (path.IsEmpty()) return Append(ClipRectRecord{{}, mode});
    AppendPath(ClipPathRecord{{}, mode}, path);
}

void StreamRecorder::FillAnimatedPath(const AnimatedPath& path, const MorphProgress& progress) {
    AppendPath(FillAnimatedPathRecord{{}, progress}, path.GetPath());
}

void StreamRecorder::StrokeAnimatedPath(const AnimatedPath& path, const MorphProgress& progress) {
    AppendPath(StrokeAnimatedPathRecord{{}, progress}, path.GetPath());
}

void StreamRecorder::SetTransform(const Matrix4& matrix) {
    if (!IsFinite(matrix)) return Refuse(CommandType::SetTransform);
    transform_ = matrix;
    Append(SetTransformRecord{matrix});
}

void StreamRecorder::MultiplyTransform(const Matrix4& matrix) {
    const Matrix4 product = transform_ * matrix;
    if (!IsFinite(matrix) || !IsFinite(product)) return Refuse(CommandType::MultiplyTransform);
    transform_ = product;
    Append(MultiplyTransformRecord{matrix});
}

void StreamRecorder::Translate(float x, float y, float z) {
    MultiplyTransform(TranslationMatrix(x, y, z));
}

void StreamRecorder::Scale(float x, float y, float z) {
    MultiplyTransform(ScaleMatrix(x, y, z));
}

void StreamRecorder::Rotate(float radians) {
    const float c = std::cos(radians), s = std::sin(radians);
    MultiplyTransform(AffineMatrix(c, s, -s, c, 0, 0));
}

void StreamRecorder::FlattenTransform() {
    transform_ = Flattened(transform_);
    Append(FlattenTransformRecord{});
}

void StreamRecorder::GetTransform(Matrix4* matrix) const {
    *matrix = transform_;
}

void StreamRecorder::CreateSurface(SurfaceId surface, const SurfaceDescription& description, uint32_t flag) {
    Append(CreateSurfaceRecord{surface, description, flag});
}

void StreamRecorder::DrawSurface(SurfaceId surface, const Rect& source, const Rect& destination,
                                 const Paint& paint) {
    Append(DrawSurfaceRecord{surface, source, destination, paint});
}

void StreamRecorder::SetDebugName(SurfaceId surface, const char* name) {
    if (!DebugNamesEnabled() || !name) return;
    const size_t length = std::min<size_t>(std::strlen(name), 255);
    Append(SetDebugNameRecord{surface, uint32_t(length)}, {{name, length}, {"", 1}});
}

CommandBuffer* StreamRecorder::BeginLayerState() {
    states_.push_back({kLayerState, transform_});
    return this;
}

CommandBuffer* StreamRecorder::BeginLayer(uint32_t flags, const LayerPaint& paint) {
    LayerPaint safe = paint;
    if (!IsFinite(paint)) safe = MakeLayerPaint(1);  // the layer must open, or its end would close another
    Append(BeginLayerRecord{flags, safe});
    return BeginLayerState();
}

CommandBuffer* StreamRecorder::BeginLayerWithEffects(uint32_t flags, const LayerPaint& paint,
                                                     const Effect* const* effects, uint32_t count) {
    LayerPaint safe = paint;
    if (!IsFinite(paint)) safe = MakeLayerPaint(1);
    const size_t start = stream_.size();
    const auto made = count - uint32_t(std::count(effects, effects + count, nullptr));
    Append(BeginLayerWithEffectsRecord{flags, safe, made});
    AppendEffects(start, effects, count);
    return BeginLayerState();
}

void StreamRecorder::EndLayerState(Matrix4* matrix) {
    if (matrix) *matrix = transform_;
    // States that were pushed inside the layer and not popped end with it.
    while (!states_.empty() && states_.back().mask != kLayerState)
        states_.pop_back();
    if (states_.empty()) {
        AssertFailure("EndLayer without a layer");
        return;
    }
    transform_ = states_.back().transform;
    states_.pop_back();
    Append(EndLayerRecord{});
}

CommandBuffer* StreamRecorder::EndLayer() {
    EndLayerState(nullptr);
    return this;
}

CommandBuffer* StreamRecorder::EndLayerTransformed(Matrix4* matrix) {
    EndLayerState(matrix);
    return this;
}

void StreamRecorder::FillLinearGradient(const Rect& rect, const Paint& paint, const GradientStop* stops,
                                        uint32_t count, const LinearGradient& geometry) {
    AppendGradient(FillLinearGradientRecord{rect, paint, geometry, 0}, stops, count);
}

void StreamRecorder::FillRadialGradient(const Rect& rect, const Paint& paint, const GradientStop* stops,
                                        uint32_t count, const RadialGradient& geometry) {
    AppendGradient(FillRadialGradientRecord{rect, paint, geometry, 0}, stops, count);
}

void StreamRecorder::FillRectWithEffect(const Rect& rect, const Paint& paint, const Effect& effect) {
    const size_t start = stream_.size();
    Append(FillRectWithEffectRecord{rect, paint, 1});
    const Effect* effects[] = {&effect};
    if (stream_.size() != start) AppendEffects(start, effects, 1);
}

void StreamRecorder::ApplyBlur(float radius) {
    Append(ApplyBlurRecord{radius});
}

void StreamRecorder::PushState(uint32_t mask) {
    states_.push_back({mask & kStateAll, transform_});
    Append(PushStateRecord{mask & kStateAll});
}

void StreamRecorder::PopState() {
    if (states_.empty() || states_.back().mask == kLayerState)
        return AssertFailure("PopState without PushState");
    if (states_.back().mask & kStateTransform) transform_ = states_.back().transform;
    states_.pop_back();
    Append(PopStateRecord{});
}

void StreamRecorder::CreateImage(ImageId image, const Image& description) {
    const uint32_t pixelSize = description.format == PixelFormat::A8 ? 1 : 4;
    const uint32_t pitch = description.rowPitch ? description.rowPitch : description.width * pixelSize;
    const bool user = description.flags & kImageUserObject;
    const size_t size = user ? sizeof(UserImage) : size_t(pitch) * description.height;
    Append(CreateImageRecord{image, description.width, description.height, uint32_t(description.format),
                             description.flags, PixelRef{KeepPixels(description.pixels, size), pitch}});
}

void StreamRecorder::UpdateImage(ImageId image, const void* pixels, size_t size, uint32_t flag) {
    Append(UpdateImageRecord{image, PixelRef{KeepPixels(pixels, size), 0}, flag});
}

void StreamRecorder::DestroyImage(ImageId image) {
    Append(DestroyImageRecord{image});
}

void StreamRecorder::SetImageDebugName(ImageId image, const char* name) {
    if (!DebugNamesEnabled() || !name) return;
    const size_t length = std::min<size_t>(std::strlen(name), 255);
    Append(SetImageDebugNameRecord{image, uint32_t(length)}, {{name, length}, {"", 1}});
}

void StreamRecorder::DrawImage(ImageId image, const Rect& dst, const Rect& src, const Paint& paint) {
    Append(DrawImageRecord{image, dst, src, paint});
}

void StreamRecorder::DrawImageTiled(ImageId image, const Rect& dst, const ImageTile& tile,
                                    const Paint& paint) {
    Append(DrawImageTiledRecord{image, dst, tile, paint});
}

void StreamRecorder::DrawYUVImage(const ImageId planes[4], const Rect& dst, const Paint& paint) {
    Append(DrawYUVImageRecord{{{planes[0], planes[1], planes[2], planes[3]}}, dst, paint});
}

void StreamRecorder::FillString(const char* utf8, size_t length, const TextPaint& paint) {
    if (length == 0 || length > kMaxRecordSize) return;
    Append(FillStringRecord{paint, uint32_t(length)}, {{utf8, length}, {"", 1}});
}

void StreamRecorder::DrawGlyphs(const Glyph* glyphs, uint32_t count, const GlyphRunParams& params) {
    AppendGlyphs<DrawGlyphsRecord>(glyphs, count, params);
}

void StreamRecorder::StrokeGlyphs(const Glyph* glyphs, uint32_t count, const GlyphRunParams& params) {
    AppendGlyphs<StrokeGlyphsRecord>(glyphs, count, params);
}

void StreamRecorder::Annotate(uint32_t kind, const void* data) {
    size_t size = 0;
    switch (kind) {
        case kAnnotateBaseTransform:
        case kAnnotateWorldMatrix:
            size = sizeof(Matrix4);
            break;
        case kAnnotateCompositionId:
            size = data ? std::strlen(static_cast<const char*>(data)) + 1 : 0;
            break;
        case kAnnotateAABB:
            size = sizeof(Rect);
            break;
        case kAnnotateScale:
            size = sizeof(renderScale_);
            if (data) std::memcpy(renderScale_, data, size);
            break;
        default:
            break;
    }
    if (!data) size = 0;
    Append(AnnotateRecord{kind, uint32_t(size)}, {{data, size}});
}

const void* StreamRecorder::Query(uint32_t kind) const {
    const State* layer = nullptr;
    for (const State& state : states_) {
        if (state.mask == kLayerState) layer = &state;
    }
    switch (kind) {
        case kQueryLocalMatrix: {
            Matrix4 inverse;
            local_ = transform_;
            if (layer && Invert(layer->transform, &inverse)) local_ = inverse * transform_;
            return &local_;
        }
        case kQueryParentBuffer:
            return layer ? static_cast<const CommandBuffer*>(this) : nullptr;
        case kQueryRenderScale:
            return renderScale_;
        default:
            return nullptr;
    }
}

// --- pool
// ----------------------------------------------------------------------------------------------------

namespace {

// Enough for the frames in flight of a few views; a buffer that grew beyond the byte limit is not kept.
constexpr size_t kMaxPooled = 32;
constexpr size_t kMaxPooledBytes = 4u << 20;

struct BufferPool {
    std::mutex mutex;
    StreamRecorder* free[kMaxPooled] = {};
    size_t count = 0;
};

BufferPool& GetBufferPool() {
    static BufferPool pool;
    return pool;
}

}  // namespace

void DrainBufferPool() {
    BufferPool& pool = GetBufferPool();
    std::lock_guard lock(pool.mutex);
    while (pool.count > 0)
        HeapDelete(pool.free[--pool.count]);
}

void StreamRecorder::Release() {
    BufferPool& pool = GetBufferPool();
    if (stream_.capacity() <= kMaxPooledBytes) {
        std::lock_guard lock(pool.mutex);
        if (pool.count < kMaxPooled) {
            pool.free[pool.count++] = this;
            return;
        }
    }
    HeapDelete(this);
}

CommandBuffer* Library::CreateBufferForSurface(SurfaceId surface, size_t size, uint32_t) {
    BufferPool& pool = GetBufferPool();
    StreamRecorder* recorder = nullptr;
    {
        std::lock_guard lock(pool.mutex);
        if (pool.count > 0) recorder = pool.free[--pool.count];
    }
    if (!recorder) recorder = HeapNew<StreamRecorder>();
    if (recorder) recorder->Begin(surface, size);
    return recorder;
}

CommandBuffer* Library::CreateBuffer(size_t size, uint32_t flags) {
    return CreateBufferForSurface(kNoId, size, flags);
}

}  // namespace fresco
