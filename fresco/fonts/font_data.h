// The bytes of a font file, shared by its faces, or the glyph table of a font of pictures: read into memory
// of this library, or left in place where the reader has them there (a mapped file). Of a font of 760 KB a
// page of text looks at some 100.
#pragma once
#include <memory>
#include <span>

#include <fresco/stream_reader.h>
#include "fresco/core/heap.h"

namespace fresco {

// The largest fonts there are (all of CJK in one collection) stay below this, packed or not.
inline constexpr size_t kMaxFontBytes = size_t(128) << 20;

struct StreamCloser {
    void operator()(IStreamReader* reader) const { reader->Close(); }
};
using StreamPtr = std::unique_ptr<IStreamReader, StreamCloser>;

class FontData {
  public:
    explicit FontData(Vector<uint8_t> bytes) : copy_(std::move(bytes)), bytes_(copy_) {}
    // Bytes of the reader, which is open as long as this lives.
    FontData(std::span<const uint8_t> bytes, StreamPtr reader) : bytes_(bytes), reader_(std::move(reader)) {}
    FontData(const FontData&) = delete;
    FontData& operator=(const FontData&) = delete;

    std::span<const uint8_t> bytes() const { return bytes_; }

  private:
    Vector<uint8_t> copy_;
    std::span<const uint8_t> bytes_;
    StreamPtr reader_;
};
using FontDataPtr = std::shared_ptr<const FontData>;

// False when there is nothing or too much.
bool ReadAll(IStreamReader* stream, Vector<uint8_t>* bytes, size_t most = kMaxFontBytes);
// What the reader has in place; empty when it must be read, or is no font by its size.
std::span<const uint8_t> InPlace(IStreamReader* stream);

FontDataPtr MakeFontData(Vector<uint8_t> bytes);
// Keeps the reader open when it has its bytes in place. Null when it cannot be read.
FontDataPtr MakeFontData(StreamPtr reader);

}  // namespace fresco
