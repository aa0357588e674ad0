// What a client gives for a bitmap font, copied, on its way to the worker that decodes it.
#pragma once

#include "core/memory/containers.h"
#include "core/memory/ref_counted.h"

namespace qorvex::layout {

struct BitmapFontPage {
    using Bytes = Vector<uint8_t, MemoryTag::General>;
    Bytes bytes;  // an image file, or pixels of `width` by `height`
    uint32_t width = 0;
    uint32_t height = 0;
    bool encoded = false;
};

struct BitmapFontSource : AtomicRefCounted<BitmapFontSource, MemoryTag::General> {
    TaggedString<MemoryTag::General> family;
    TaggedString<MemoryTag::General> table;  // BMFont, text form
    Vector<BitmapFontPage, MemoryTag::General> pages;
};

using BitmapFontSourcePtr = qsl::RefPtr<BitmapFontSource>;

}  // namespace qorvex::layout
