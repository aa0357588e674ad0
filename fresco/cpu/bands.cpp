#include "fresco/cpu/bands.h"

namespace fresco::cpu {
namespace {

// Walks the records of one stream.
class Survey {
  public:
    Survey(const CpuBackend& backend, IRect* area) : backend_(backend), area_(area) {}

    bool Accepts(const CommandBuffer& buffer) {
        if (buffer.GetTargetSurface() != kNoId) return false;
        const auto* cursor = static_cast<const uint8_t*>(buffer.GetStream());
        const uint8_t* end = cursor + buffer.GetStreamSize();
        while (size_t(end - cursor) >= sizeof(RecordHeader)) {
            const auto& header = *reinterpret_cast<const RecordHeader*>(cursor);
            if (!Accepts(CommandType(header.type), cursor + sizeof(header))) return false;
            cursor += header.size;
        }
        return true;
    }

  private:
    bool Accepts(CommandType type, const uint8_t* body) {
        switch (type) {
            case CommandType::CreateImage:
            case CommandType::UpdateImage:
            case CommandType::DestroyImage:
            case CommandType::CreateSurface:
            case CommandType::ApplyBlur:
                return false;
            case CommandType::BeginLayerWithEffects:
                leading_ = false;
                return !backend_.HasCustomEffectRenderer() || !HasCustomEffect(body);
            case CommandType::Annotate:
                return !backend_.HasCustomCompositor() ||
                       reinterpret_cast<const AnnotateRecord*>(body)->kind != kAnnotateCompositionId;
            case CommandType::MultiplyTransform:
                transform_ = transform_ * reinterpret_cast<const MultiplyTransformRecord*>(body)->matrix;
                return true;
            case CommandType::ClipRect:
                AddScissor(*reinterpret_cast<const ClipRectRecord*>(body));
                return true;
            case CommandType::ClipQuad:
                AddScissor(*reinterpret_cast<const ClipQuadRecord*>(body));
                return true;
            case CommandType::BeginScissor:
            case CommandType::PushState:
                return true;
            default:
                leading_ = false;
                return true;
        }
    }

    static bool HasCustomEffect(const uint8_t* body) {
        const auto& record = *reinterpret_cast<const BeginLayerWithEffectsRecord*>(body);
        const uint8_t* cursor = body + sizeof(record);
        for (uint32_t i = 0; i < record.count; ++i) {
            const auto& effect = *reinterpret_cast<const EffectHeader*>(cursor);
            if (effect.kind == uint32_t(EffectKind::Custom)) return true;
            cursor += sizeof(effect) + effect.size;
        }
        return false;
    }

    void AddScissor(const ClipRectRecord& record) {
        const Rect& r = record.rect;
        Add({{r.x, r.y}, {r.x + r.width, r.y + r.height}}, record.mode);
    }
    void AddScissor(const ClipQuadRecord& record) {
        const Point3* p = record.quad.points;
        Add({{std::min({p[0].x, p[1].x, p[2].x, p[3].x}), std::min({p[0].y, p[1].y, p[2].y, p[3].y})},
             {std::max({p[0].x, p[1].x, p[2].x, p[3].x}), std::max({p[0].y, p[1].y, p[2].y, p[3].y})}},
            record.mode);
    }
    struct Corners {
        Point low, high;
    };
    // Only a hint for how to cut: what no scissor shows is clipped all the same.
    void Add(const Corners& c, uint32_t mode) {
        const Homography plane = Homography::FromMatrix(transform_);
        if (!leading_ || !plane.IsScaleTranslate()) return;
        const Vec2 a = plane.Apply(c.low.x, c.low.y), b = plane.Apply(c.high.x, c.high.y);
        const IRect rect =
            RoundOut(std::min(a.x, b.x), std::min(a.y, b.y), std::max(a.x, b.x), std::max(a.y, b.y));
        if (mode == kClipAdd)
            *area_ = Unite(*area_, rect);
        else if (mode == kClipSet)
            *area_ = rect;
    }

    const CpuBackend& backend_;
    IRect* area_;
    Matrix4 transform_;
    bool leading_ = true;  // before the first draw
};

}  // namespace

bool CanPaintInBands(CommandBuffer* const* buffers, uint32_t count, const CpuBackend& backend, IRect* area) {
    const IRect target = backend.GetRenderTarget().bounds;
    IRect all;
    for (uint32_t i = 0; i < count; ++i) {
        if (!buffers[i]) continue;
        IRect scissors = target;
        if (!Survey(backend, &scissors).Accepts(*buffers[i])) return false;
        all = Unite(all, Intersect(scissors, target));
    }
    *area = all;
    return !all.IsEmpty();
}

IRect BandJob::BandAt(uint32_t band) const {
    const auto edge = [&](uint32_t i) { return area_.y0 + int(int64_t(area_.Height()) * i / bands_); };
    return {area_.x0, edge(band), area_.x1, edge(band + 1)};
}

void BandJob::Run() {
    // A helper that comes late finds no band, and touches nothing that may be gone.
    uint32_t band = nextBand_.fetch_add(1, std::memory_order_relaxed);
    if (band >= bands_) return;
    CpuBackend& painter = *painters_[nextPainter_.fetch_add(1, std::memory_order_relaxed)];
    for (; band < bands_; band = nextBand_.fetch_add(1, std::memory_order_relaxed)) {
        painter.SetBand(BandAt(band));
        for (uint32_t i = 0; i < bufferCount_; ++i) {
            if (buffers_[i]) painter.Execute(BufferSource(*buffers_[i]));
        }
        if (finished_.fetch_add(1, std::memory_order_acq_rel) + 1 == bands_) finished_.notify_all();
    }
}

void BandJob::Wait() {
    for (uint32_t done = finished_.load(std::memory_order_acquire); done < bands_;
         done = finished_.load(std::memory_order_acquire))
        finished_.wait(done, std::memory_order_acquire);
}

void BandJob::Release() {
    if (references_.fetch_sub(1, std::memory_order_acq_rel) == 1) HeapDelete(this);
}

}  // namespace fresco::cpu
