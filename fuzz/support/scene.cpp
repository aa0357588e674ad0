#include "support/scene.h"

#include <cstdio>
#include <cstdlib>

#include <fresco/library.h>

namespace qorvex::fuzz {

void* FrescoAllocator::Allocate(size_t size, size_t alignment) {
    void* block = nullptr;
    if (posix_memalign(&block, alignment < sizeof(void*) ? sizeof(void*) : alignment, size ? size : 1) != 0)
        return nullptr;
    ++live;
    return block;
}

void FrescoAllocator::Deallocate(void* block, size_t) {
    if (block) --live;
    std::free(block);
}

Scene::Scene() {
    fresco::RenderingLibraryParams params;
    params.allocator = &allocator_;
    params.logHandler = &log_;
    library_ = fresco::IRenderingLibrary::Initialize(params);
    scene_ = library_->CreateScene({});
    target_ = {pixels_.data(), kSide, kSide, kSide * 4};
    scene_->SetRenderTarget(&target_, nullptr, {});
}

Scene::~Scene() {
    scene_->Destroy();
    library_->Destroy();
    if (allocator_.live == 0) return;
    std::fprintf(stderr, "FINDING: %ld blocks left behind\n", allocator_.live);
    std::abort();
}

void Scene::Draw(fresco::CommandBuffer* buffer) {
    scene_->ExecuteBackEnd(&buffer, 1);
    buffer->Release();
}

void Scene::Draw(std::span<fresco::CommandBuffer* const> resources,
                 std::span<fresco::CommandBuffer* const> drawing) {
    scene_->ExecuteFrontEnd(resources.data(), static_cast<uint32_t>(resources.size()));
    scene_->ExecuteBackEnd(drawing.data(), static_cast<uint32_t>(drawing.size()));
}

}  // namespace qorvex::fuzz
