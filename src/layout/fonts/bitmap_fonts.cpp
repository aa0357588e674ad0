// Bitmap fonts of the client: images are decoded on a worker, the font is made on the DOM thread.
#include <fresco/library.h>

#include "core/logging/log.h"
#include "layout/fonts/font_manager.h"
#include "layout/fonts/memory_stream.h"

namespace qorvex::layout {

namespace {

constexpr uint32_t kPixelBytes = 4;

bool Decode(BitmapFontPage& page) {
    if (!page.encoded) return !page.bytes.empty();
    fresco::ImageInfo info{};
    fresco::FrameResult frame;
    uint32_t frames = 0, delay = 0;
    const fresco::ImageDecodeResult decoded =
        fresco::Library::DecodeImageMemory(page.bytes.data(), page.bytes.size(), 0, 0, 0, true, info, frames,
                                           delay, &frame, fresco::PixelFormat::RGBA8);
    if (decoded == fresco::ImageDecodeResult::Failed || frame.pixels == nullptr) return false;
    const auto* pixels = static_cast<const uint8_t*>(frame.pixels);
    page.width = frame.rowPitch / kPixelBytes;
    page.height = frame.rowPitch ? static_cast<uint32_t>(frame.size / frame.rowPitch) : 0;
    page.bytes.assign(pixels, pixels + frame.size);
    page.encoded = false;
    fresco::Library::FreeDecodedImage(frame.pixels);
    return page.width > 0 && page.height > 0;
}

bool DecodeAll(BitmapFontSource& source) {
    for (BitmapFontPage& page : source.pages) {
        if (!Decode(page)) return false;
    }
    return !source.pages.empty();
}

fresco::FontId Register(fresco::IFontService& service, const BitmapFontSource& source, uint32_t flags) {
    Vector<fresco::BitmapFontImage, MemoryTag::General> images;
    for (const BitmapFontPage& page : source.pages)
        images.push_back({page.bytes.data(), page.width, page.height, page.width * kPixelBytes});
    MemoryStream table(reinterpret_cast<const unsigned char*>(source.table.data()), source.table.size());
    return service.RegisterBitmapFont(&table, {source.family.c_str(), flags, images.data(), images.size()});
}

}  // namespace

void FontManager::AddBitmapFont(const FontDescription& description, BitmapFontSourcePtr source) {
    if (loaded_.contains(description))
        LogInfo("Bitmap font ", description.family.view(), " already loaded, will replace its description!");
    pending_.try_emplace(description);
    FontManager* manager = this;
    family_.Push(TaskChannels::Resources,
                 MakeTask("DecodeUserFontImages", [manager, family = family_, description,
                                                   source = std::move(source)] {
                     const bool decoded = DecodeAll(*source);
                     if (!decoded) LogWarning("Cannot load image for user font");
                     family.Push(TaskChannels::Main, MakeTask("Create User font", [=] {
                                     manager->CreateBitmapFont(description, decoded ? source.get() : nullptr);
                                 }));
                 }));
}

void FontManager::CreateBitmapFont(const FontDescription& description, const BitmapFontSource* source) {
    const fresco::FontId id = source ? Register(service_, *source, ToFontFlags(description)) : fresco::kNoId;
    if (source && id == fresco::kNoId) LogWarning("Unable to load user font ", description.family.view());
    if (fresco::IFont* font = id == fresco::kNoId ? nullptr : service_.GetFont(id)) {
        font->MarkAsUserBitmapFont();
        loaded_.insert_or_assign(description, id);
    }
    TellWaiters(description);
}

}  // namespace qorvex::layout
