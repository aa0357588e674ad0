#include "canvas.h"

#include <cstdio>

#include <gtest/gtest.h>

namespace fresco::test {

std::vector<uint8_t> ReadFile(const std::string& path) {
    std::vector<uint8_t> bytes;
    if (FILE* file = std::fopen(path.c_str(), "rb")) {
        uint8_t block[65536];
        while (const size_t read = std::fread(block, 1, sizeof(block), file))
            bytes.insert(bytes.end(), block, block + read);
        std::fclose(file);
    }
    return bytes;
}

Canvas::Canvas(int w, int h) : width(w), height(h), pixels(size_t(w) * size_t(h), 0) {
    RenderingLibraryParams params;
    params.allocator = &allocator;
    params.logHandler = &log;
    library = IRenderingLibrary::Initialize(params);
    scene = library->CreateScene({});
    target = {pixels.data(), uint32_t(w), uint32_t(h), uint32_t(w) * 4};
    scene->SetRenderTarget(&target, nullptr, {});
}

Canvas::~Canvas() {
    scene->Destroy();
    library->Destroy();
    EXPECT_EQ(allocator.live, 0);
}

void Canvas::Draw(CommandBuffer* buffer) {
    scene->ExecuteBackEnd(&buffer, 1);
    buffer->Release();
}

Pixel Canvas::At(int x, int y) const {
    const uint32_t p = pixels[size_t(y) * size_t(width) + size_t(x)];
    return {int(p & 255), int(p >> 8 & 255), int(p >> 16 & 255), int(p >> 24)};
}

FontId Canvas::LoadFont(const std::string& path) {
    MemoryReader reader(ReadFile(path));
    return library->GetFontService()->LoadFace(&reader, 0, SdfMode::Never);
}

long Canvas::Ink() const {
    long ink = 0;
    for (const uint32_t pixel : pixels)
        ink += long(pixel >> 24);
    return ink;
}

}  // namespace fresco::test
