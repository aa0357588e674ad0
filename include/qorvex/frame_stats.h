// What one frame of a view cost: the feature interface kFrameStatsFeature. For profilers and tests; it costs
// a few clock reads a frame while it is on and nothing while it is off.
#pragma once

#include <cstdint>

namespace qorvex {

class View;

// An id of this project's own, beyond those that the engine family shares.
constexpr unsigned kFrameStatsFeature = 0x51000001u;

// A switch for LibraryParams::AdditionalOptions: counts allocations for each thread, at the price of one more
// call for each of them.
constexpr const char* kCountAllocationsOption = "--count-allocations";

// Stages of a frame in thread CPU milliseconds. Advance is the whole main-thread call; the sum of Script,
// Style and Commit is a part of it, and in synchronous layout mode so are Layout and Record.
struct FrameStats {
    std::uint32_t FrameId = 0;
    double Script = 0;
    double Style = 0;
    double Commit = 0;
    double Layout = 0;
    double Record = 0;
    double Paint = 0;
    double Advance = 0;
    // Work done in this frame.
    std::uint64_t Restyled = 0;       // elements whose style was solved
    std::uint64_t LaidOut = 0;        // layout nodes whose geometry was worked on
    std::uint64_t Recorded = 0;       // display elements recorded
    std::uint64_t PaintedPixels = 0;  // pixels inside the redrawn rectangles
    // With kCountAllocationsOption: requests to the client's allocator inside Advance, on its thread; else 0.
    std::uint64_t Allocations = 0;
};

class IFrameStats {
  public:
    // Main thread. Off at first.
    virtual void SetEnabled(View* view, bool enabled) = 0;
    // Main thread, or wherever the view's Advance and Paint do not run at the moment. The numbers of a frame
    // that has completed (and been painted, for Paint and PaintedPixels); false when the frame is not among
    // the last eight.
    virtual bool GetFrame(View* view, std::uint32_t frameId, FrameStats* out) = 0;

  protected:
    virtual ~IFrameStats() = default;
};

}  // namespace qorvex
