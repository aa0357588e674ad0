// Fonts that the client registers with a system.
#include <cstring>

#include "core/api_call.h"
#include "core/library_impl.h"
#include "core/limits.h"
#include "core/logging/log.h"
#include "core/system_impl.h"

namespace qorvex {

void SystemImpl::ConfigureFontService(void* argument) {
    const MainThreadCall call("System");
    if (!call) return;
    if (fresco::IFontService* fonts = library_.GetRendering().GetFontService()) fonts->Configure(argument);
}

layout::FontDescription SystemImpl::MakeFontDescription(const FontDescription& description) {
    layout::FontDescription made;
    if (description.FamilyName) made.family = font_names_.Intern(description.FamilyName);
    made.style = description.Style;
    made.weight = description.Weight;
    return made;
}

void SystemImpl::AddUserFont(const char* url, const FontDescription& description, FontSDF::Mode use_sdf) {
    const MainThreadCall call("System");
    if (!call) return;
    URL parsed;
    parsed.Parse(url ? url : "");
    if (description.Weight > layout::kHeaviestWeight) {
        AssertFailure("Invalid font weight passed as font description");
    } else if (description.Style > FontStyles::Oblique) {
        AssertFailure("Invalid font style passed as font description");
    } else if (use_sdf > FontSDF::Auto) {
        AssertFailure("Invalid useSDF argument value passed");
    } else if (parsed.IsEmpty()) {
        AssertFailure("Invalid url passed as font description");
    } else if (fonts_) {
        fonts_->AddFontDescription(MakeFontDescription(description), parsed, use_sdf);
    }
}

namespace {

layout::BitmapFontSourcePtr StartBitmapFont(const UserFontDescription& description) {
    auto source = MakeRef<layout::BitmapFontSource>();
    if (description.FamilyName) source->family = description.FamilyName;
    if (description.Description && description.DescriptionSize <= limits::kBitmapFontBytes)
        source->table = std::string_view(description.Description, description.DescriptionSize);
    return source;
}

layout::BitmapFontPage CopyPage(const void* bytes, size_t size) {
    layout::BitmapFontPage page;
    const auto* first = static_cast<const uint8_t*>(bytes);
    if (bytes && size <= limits::kBitmapFontBytes) page.bytes.assign(first, first + size);
    return page;
}

// Rows without the space between them.
layout::BitmapFontPage CopyPixels(const UserFontImage& image) {
    constexpr size_t kPixelBytes = 4;
    const size_t row = image.Width * kPixelBytes;
    layout::BitmapFontPage page;
    if (!image.Pixels || image.RowPitch < row || row * image.Height > limits::kBitmapFontBytes) return page;
    page.width = image.Width;
    page.height = image.Height;
    page.bytes.resize(row * image.Height);
    for (size_t y = 0; y < image.Height; ++y)
        std::memcpy(page.bytes.data() + y * row,
                    static_cast<const uint8_t*>(image.Pixels) + y * image.RowPitch, row);
    return page;
}

}  // namespace

void SystemImpl::AddBitmapFont(const UserFontDescription& description, layout::BitmapFontSourcePtr source) {
    if (description.Weight > layout::kHeaviestWeight) {
        AssertFailure("Invalid font weight passed as font description");
        return;
    }
    if (!fonts_) return;
    layout::FontDescription made;
    made.family = font_names_.Intern(source->family.view());
    made.style = description.Italic ? layout::kItalicStyle : layout::kNormalStyle;
    constexpr uint8_t kBoldWeight = 7;
    made.weight = description.Weight ? description.Weight
                  : description.Bold ? kBoldWeight
                                     : layout::kNormalWeight;
    fonts_->AddBitmapFont(made, std::move(source));
}

void SystemImpl::AddUserFontFromImages(const UserFontImage* images, unsigned count,
                                       const UserFontDescription& description) {
    const MainThreadCall call("System");
    if (!call) return;
    layout::BitmapFontSourcePtr source = StartBitmapFont(description);
    for (unsigned i = 0; images && i < count; ++i)
        source->pages.push_back(CopyPixels(images[i]));
    AddBitmapFont(description, std::move(source));
}

void SystemImpl::AddUserFontFromEncodedImages(const void** data, const uint32_t* sizes, unsigned count,
                                              const UserFontDescription& description) {
    const MainThreadCall call("System");
    if (!call) return;
    layout::BitmapFontSourcePtr source = StartBitmapFont(description);
    for (unsigned i = 0; data && sizes && i < count; ++i) {
        source->pages.push_back(CopyPage(data[i], sizes[i]));
        source->pages.back().encoded = true;
    }
    AddBitmapFont(description, std::move(source));
}

void SystemImpl::RemoveUserFont(const FontDescription& description) {
    const MainThreadCall call("System");
    if (!call) return;
    if (fonts_) fonts_->RemoveFontDescription(MakeFontDescription(description));
}

}  // namespace qorvex
