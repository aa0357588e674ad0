#include "display/scratch_surfaces.h"

#include "core/logging/log.h"

#include <fresco/library.h>

namespace qorvex::dsp {

fresco::SurfaceId ScratchSurfaces::Take(uint32_t width, uint32_t height, FrameRecord& record) {
    for (Scratch& scratch : surfaces_) {
        if (scratch.clients != 0 || scratch.width != width || scratch.height != height) continue;
        scratch.clients = 1;
        return scratch.surface;
    }
    const fresco::SurfaceId surface = fresco::Library::GetSurfaceName();
    fresco::CommandBuffer* buffer = fresco::Library::CreateBuffer(64, 0);
    if (buffer == nullptr) return fresco::kNoId;
    buffer->CreateSurface(surface, {width, height, fresco::PixelFormat::RGBA8}, 0);
    record.resourceBuffers.push_back(buffer);
    surfaces_.push_back({surface, width, height, 1});
    return surface;
}

ScratchSurfaces::Scratch* ScratchSurfaces::Find(fresco::SurfaceId surface) {
    for (Scratch& scratch : surfaces_) {
        if (scratch.surface == surface) return &scratch;
    }
    return nullptr;
}

void ScratchSurfaces::AddClient(fresco::SurfaceId surface) {
    if (Scratch* scratch = Find(surface)) ++scratch->clients;
}

void ScratchSurfaces::GiveBack(fresco::SurfaceId surface) {
    Scratch* scratch = Find(surface);
    if (scratch != nullptr && scratch->clients > 0) --scratch->clients;
}

void ScratchSurfaces::FreeAll(FrameRecord& record) {
    for (const Scratch& scratch : surfaces_) {
        if (scratch.clients != 0) AssertFailure("Trying to force free a surface that still has clients");
        record.surfacesToFree.push_back(scratch.surface);
    }
    surfaces_.clear();
}

}  // namespace qorvex::dsp
