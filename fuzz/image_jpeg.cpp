// JPEG files.
#include "support/image_decoding.h"

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
    using namespace qorvex::fuzz;
    DecodeImage(WithSignature(data, size, "\xFF\xD8\xFF"));
    return 0;
}
