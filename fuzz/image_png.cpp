// PNG files. The checksums of their chunks are put right first: a mutation never guesses them, and would end
// there.
#include "support/image_decoding.h"

namespace qorvex::fuzz {
namespace {

uint32_t Checksum(const uint8_t* data, size_t size) {
    uint32_t crc = 0xFFFFFFFF;
    for (size_t i = 0; i < size; ++i) {
        crc ^= data[i];
        for (int bit = 0; bit < 8; ++bit)
            crc = crc >> 1 ^ (crc & 1 ? 0xEDB88320 : 0);
    }
    return ~crc;
}

void FixChecksums(std::vector<uint8_t>& file) {
    for (size_t at = 8; at + 12 <= file.size();) {
        const uint32_t length =
            uint32_t{file[at]} << 24 | file[at + 1] << 16 | file[at + 2] << 8 | file[at + 3];
        if (length > file.size() - at - 12) return;
        const uint32_t crc = Checksum(&file[at + 4], length + 4);
        for (int i = 0; i < 4; ++i)
            file[at + 8 + length + i] = static_cast<uint8_t>(crc >> (24 - 8 * i));
        at += length + 12;
    }
}

}  // namespace
}  // namespace qorvex::fuzz

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
    using namespace qorvex::fuzz;
    std::vector<uint8_t> file = WithSignature(data, size, "\x89PNG\r\n\x1A\n");
    FixChecksums(file);
    DecodeImage(file);
    return 0;
}
