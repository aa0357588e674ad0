// Temporary surfaces of one frame, shared by size: one that a client has given back serves the next one.
#pragma once

#include "display/frame_record.h"

namespace qorvex::dsp {

class ScratchSurfaces {
  public:
    // A surface of exactly this size with one client. Its content is undefined.
    fresco::SurfaceId Take(uint32_t width, uint32_t height, FrameRecord& record);
    void AddClient(fresco::SurfaceId surface);
    void GiveBack(fresco::SurfaceId surface);

    // The end of a frame: all surfaces go with it.
    void FreeAll(FrameRecord& record);
    void Forget() { surfaces_.clear(); }

  private:
    struct Scratch {
        fresco::SurfaceId surface;
        uint32_t width;
        uint32_t height;
        uint32_t clients;
    };
    Scratch* Find(fresco::SurfaceId surface);

    Vector<Scratch, MemoryTag::Rendering> surfaces_;
};

}  // namespace qorvex::dsp
