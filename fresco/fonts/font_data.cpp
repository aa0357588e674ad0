#include "fresco/fonts/font_data.h"

#include "fresco/core/prefault.h"

namespace fresco {

bool ReadAll(IStreamReader* stream, Vector<uint8_t>* bytes, size_t most) {
    const size_t size = stream ? stream->GetSize() : 0;
    if (size == 0 || size > most) return false;
    if (const auto* data = static_cast<const uint8_t*>(stream->GetData())) {
        bytes->assign(data, data + size);
        return true;
    }
    bytes->reserve(size);
    Prefault(bytes->data(), size);
    bytes->resize(size);
    size_t done = 0;
    while (done < size) {
        const size_t read = stream->Read(done, bytes->data() + done, size - done);
        if (read == 0 || read > size - done) return false;
        done += read;
    }
    return true;
}

std::span<const uint8_t> InPlace(IStreamReader* stream) {
    const size_t size = stream ? stream->GetSize() : 0;
    if (size == 0 || size > kMaxFontBytes) return {};
    const auto* data = static_cast<const uint8_t*>(stream->GetData());
    return data ? std::span(data, size) : std::span<const uint8_t>();
}

FontDataPtr MakeFontData(Vector<uint8_t> bytes) {
    return std::allocate_shared<FontData>(StdAllocator<FontData>(), std::move(bytes));
}

FontDataPtr MakeFontData(StreamPtr reader) {
    if (const auto bytes = InPlace(reader.get()); !bytes.empty())
        return std::allocate_shared<FontData>(StdAllocator<FontData>(), bytes, std::move(reader));
    Vector<uint8_t> copy;
    return ReadAll(reader.get(), &copy) ? MakeFontData(std::move(copy)) : nullptr;
}

}  // namespace fresco
