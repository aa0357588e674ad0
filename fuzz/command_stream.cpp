// Captured frames as files: whatever they say, they are drawn or refused.
#include <cstring>
#include <vector>

#include <fresco/library.h>

#include "fresco/cpu/replay.h"
#include "support/engine.h"
#include "support/scene.h"

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
    const qorvex::fuzz::Scene scene;
    // A replay asks for eight-byte places.
    std::vector<uint64_t> file(size / 8 + 1);
    if (size) std::memcpy(file.data(), data, size);
    fresco::cpu::PixelBuffer picture;
    const char* error = nullptr;
    const bool drawn = fresco::cpu::ReplayCapture(file.data(), size, &picture, &error);
    qorvex::fuzz::Require(drawn == (error == nullptr), "a refusal has a reason");
    return 0;
}
