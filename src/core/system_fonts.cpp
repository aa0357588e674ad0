// Fonts that the client registers with a system.
#include "core/library_impl.h"
#include "core/memory/thread_scope.h"
#include "core/system_impl.h"
#include "core/unavailable.h"

namespace qorvex {

void SystemImpl::ConfigureFontService(void* argument) {
    ThreadScope scope;
    if (fresco::IFontService* fonts = library_.GetRendering().GetFontService()) fonts->Configure(argument);
}

layout::FontDescription SystemImpl::MakeFontDescription(const FontDescription& description) {
    layout::FontDescription made;
    if (description.FamilyName) made.family = strings_.Intern(description.FamilyName);
    made.style = description.Style;
    made.weight = description.Weight;
    return made;
}

void SystemImpl::AddUserFont(const char* url, const FontDescription& description, FontSDF::Mode use_sdf) {
    ThreadScope scope;
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

void SystemImpl::AddUserFontFromImages(const UserFontImage*, unsigned, const UserFontDescription&) {
    ThreadScope scope;
    LogUnavailable("System::AddUserFontFromImages");
}

void SystemImpl::AddUserFontFromEncodedImages(const void**, const uint32_t*, unsigned,
                                              const UserFontDescription&) {
    ThreadScope scope;
    LogUnavailable("System::AddUserFontFromEncodedImages");
}

void SystemImpl::RemoveUserFont(const FontDescription& description) {
    ThreadScope scope;
    if (fonts_) fonts_->RemoveFontDescription(MakeFontDescription(description));
}

}  // namespace qorvex
