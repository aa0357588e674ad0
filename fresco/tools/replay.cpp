// fresco-replay FILE --png OUT: draws a captured frame and writes it as a picture.
// Exit 0; 2 with one line on standard error for a bad argument or a file that is no sound capture.
#include <cstdio>
#include <cstring>

#include <fresco/library.h>
#include "fresco/cpu/replay.h"
#include "fresco/images/png_writer.h"

namespace {

int Refuse(const char* what, const char* name) {
    std::fprintf(stderr, "fresco-replay: %s: %s\n", name, what);
    return 2;
}

class PrintLog final : public fresco::Logging::ILogHandler {
  public:
    void WriteLog(fresco::Logging::Severity, const char* text, size_t) override {
        std::fprintf(stderr, "%s\n", text);
    }
};

bool ReadWhole(const char* path, fresco::Vector<uint8_t>* bytes) {
    FILE* file = std::fopen(path, "rb");
    if (!file) return false;
    uint8_t block[1 << 16];
    while (const size_t read = std::fread(block, 1, sizeof(block), file))
        bytes->insert(bytes->end(), block, block + read);
    const bool whole = !std::ferror(file);
    std::fclose(file);
    return whole;
}

}  // namespace

int main(int argc, char** argv) {
    const char *input = nullptr, *output = nullptr;
    for (int i = 1; i < argc; ++i) {
        if (std::strcmp(argv[i], "--png") == 0 && i + 1 < argc)
            output = argv[++i];
        else if (!input && argv[i][0] != '-')
            input = argv[i];
        else
            return Refuse("unknown argument; usage: fresco-replay FILE --png OUT", argv[i]);
    }
    if (!input || !output) return Refuse("usage: fresco-replay FILE --png OUT", "missing argument");

    PrintLog log;
    fresco::Library::Start(nullptr, &log, fresco::Logging::Warning);
    fresco::Vector<uint8_t> bytes;
    if (!ReadWhole(input, &bytes)) return Refuse("cannot be read", input);
    fresco::cpu::PixelBuffer picture;
    const char* error = nullptr;
    if (!fresco::cpu::ReplayCapture(bytes.data(), bytes.size(), &picture, &error))
        return Refuse(error, input);
    const fresco::Vector<uint8_t> png = fresco::EncodePng(
        picture.pixels(), uint32_t(picture.width()), uint32_t(picture.height()), size_t(picture.width()) * 4);
    FILE* file = png.empty() ? nullptr : std::fopen(output, "wb");
    const bool written = file && std::fwrite(png.data(), 1, png.size(), file) == png.size();
    if (file && std::fclose(file) != 0) return Refuse("cannot be written", output);
    return written ? 0 : Refuse("cannot be written", output);
}
