// A frame in horizontal bands, painted by several threads. Each band is a partial repaint of the whole
// stream, and those are exact: so the picture is the same however it is cut and whoever paints.
#pragma once
#include <atomic>

#include <fresco/paint_helpers.h>
#include "fresco/cpu/cpu_backend.h"

namespace fresco::cpu {

// True when the buffers only draw into the target, so that bands may be painted side by side. Resource
// records, blurs of the whole target and calls to the client have to happen once and in order. `area` takes
// what the scissors at the beginning leave of the target.
bool CanPaintInBands(CommandBuffer* const* buffers, uint32_t count, const CpuBackend& backend, IRect* area);

class BandJob final : public IPaintWork {
  public:
    // One painter for each thread that may come. All pointers are used until Wait has returned.
    BandJob(CommandBuffer* const* buffers, uint32_t bufferCount, const IRect& area, uint32_t bands,
            CpuBackend* const* painters)
        : buffers_(buffers), bufferCount_(bufferCount), area_(area), bands_(bands), painters_(painters) {}

    void Run() override;
    void Release() override;
    void AddRef() { references_.fetch_add(1, std::memory_order_relaxed); }
    // Until every band that somebody has begun is finished. After this thread's own Run.
    void Wait();

  private:
    IRect BandAt(uint32_t band) const;

    CommandBuffer* const* buffers_;
    uint32_t bufferCount_;
    IRect area_;
    uint32_t bands_;
    CpuBackend* const* painters_;
    std::atomic<uint32_t> references_{1}, nextBand_{0}, nextPainter_{0}, finished_{0};
};

}  // namespace fresco::cpu
