// URLs in values: made absolute once, when a sheet is converted, so that nobody needs to know later which
// sheet a value came from.
#include "css/parser/convert.h"
#include "css/parser/convert_declaration.h"

namespace qorvex::css {

namespace {

// Calls visit(url) for each URL text in a plain value.
template <class Visitor>
void VisitUrls(const Declaration& declaration, Visitor&& visit) {
    if (!declaration.IsValue()) return;
    auto visitImage = [&](const ImageValue& image) {
        if (image.kind == ImageKind::Url) visit(image.url);
    };
    switch (declaration.property()) {
        case PropertyId::BackgroundImage:
            for (const ImageValue& image : declaration.As<ImageValueList>())
                visitImage(image);
            break;
        case PropertyId::MaskImage:
        case PropertyId::BorderImageSource:
            visitImage(declaration.As<ImageValue>());
            break;
        case PropertyId::Cursor:
            if (!declaration.As<CursorProperty>().url.empty()) visit(declaration.As<CursorProperty>().url);
            break;
        default:
            break;
    }
}

}  // namespace

void ForEachImageUrl(const Declaration& declaration, void (*visit)(std::string_view url, void* user),
                     void* user) {
    VisitUrls(declaration, [&](const CssString& url) { visit(url, user); });
}

void ResolveImageUrls(Declaration& declaration, const URL& base) {
    VisitUrls(declaration, [&](const CssString& url) {
        // The declaration is the caller's own; the visitor is const for all its other users.
        CssString& text = const_cast<CssString&>(url);
        text = ResolveUrl(text, base);
    });
}

void ResolveImageUrls(Declaration& declaration, ConversionContext& context) {
    ResolveImageUrls(declaration, context.base);
    if (!context.imageUrls) return;
    VisitUrls(declaration, [&](const CssString& url) { context.imageUrls->insert(url); });
}

// Looks no further than the scheme of an absolute one: data URLs can be long.
static bool HasScheme(std::string_view url) {
    size_t end = url.find_first_of(":/?#");
    return end != std::string_view::npos && end > 0 && url[end] == ':';
}

CssString ResolveUrl(std::string_view url, const URL& base) {
    if (HasScheme(url) || !base.IsValid() || base.IsRelative()) return CssString(url);
    URL relative(url);
    if (!relative.IsValid()) return CssString(url);
    URL absolute = relative.Merge(base);
    return CssString(absolute.IsValid() ? absolute.GetText().view() : url);
}

}  // namespace qorvex::css
