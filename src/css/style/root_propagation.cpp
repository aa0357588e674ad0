#include "css/style/root_propagation.h"

#include "css/style/property_appliers.h"
#include "dom/document.h"

namespace qorvex::css {
namespace {

template <PropertyId id>
void Put(dom::Document& document, dom::Element& element, typename PropertyTraits<id>::Type value) {
    const PropertyApplier& applier = kPropertyAppliers[IndexOf(id)];
    if (applier.store(element.GetStyle(), &value)) document.NoteStyleChange(element, applier.changeMask);
}

bool IsVisible(const RootStyles::Cascaded& style) {
    return style.overflowX == CSSOverflow::Visible && style.overflowY == CSSOverflow::Visible;
}

// A viewport clips and scrolls by need unless it is told to hide.
CSSOverflow ViewportOverflow(CSSOverflow source) {
    return source == CSSOverflow::Hidden ? CSSOverflow::Hidden : CSSOverflow::Auto;
}

}  // namespace

void RootStyles::Record(bool isHtml, PropertySolver& solver) {
    Cascaded& style = isHtml ? html_ : body_;
    ValueSource source;
    style.background = solver.Compute<PropertyId::BackgroundColor>(source);
    style.hasBackground = source == ValueSource::Declaration || source == ValueSource::Animation;
    style.overflowX = solver.Compute<PropertyId::OverflowX>(source);
    style.overflowY = solver.Compute<PropertyId::OverflowY>(source);
    pending_ = true;
}

const void* RootStyles::Find(bool isHtml, PropertyId id) const {
    const Cascaded& style = isHtml ? html_ : body_;
    switch (id) {
        case PropertyId::BackgroundColor:
            return &style.background;
        case PropertyId::OverflowX:
            return &style.overflowX;
        case PropertyId::OverflowY:
            return &style.overflowY;
        default:
            return nullptr;
    }
}

void RootStyles::Propagate(dom::Document& document) {
    pending_ = false;
    dom::Element* html = document.GetHtmlElement();
    dom::Element* body = document.GetBodyElement();
    if (!html) return;
    const Cascaded nothing;
    const Cascaded& below = body ? body_ : nothing;

    const bool moves = below.hasBackground && (!html_.hasBackground || html_.background.IsTransparent());
    Put<PropertyId::BackgroundColor>(document, *html, moves ? below.background : html_.background);
    if (body)
        Put<PropertyId::BackgroundColor>(document, *body, moves ? Color::Transparent() : below.background);

    // While neither says anything about overflow, both stay as they are.
    const bool propagates = !IsVisible(html_) || !IsVisible(below);
    const Cascaded& source = IsVisible(html_) ? below : html_;
    const CSSOverflow x = propagates ? ViewportOverflow(source.overflowX) : CSSOverflow::Visible;
    const CSSOverflow y = propagates ? ViewportOverflow(source.overflowY) : CSSOverflow::Visible;
    Put<PropertyId::OverflowX>(document, *html, x);
    Put<PropertyId::OverflowY>(document, *html, y);
    if (!body) return;
    const bool resets = propagates && (x != CSSOverflow::Hidden || y != CSSOverflow::Hidden);
    Put<PropertyId::OverflowX>(document, *body, resets ? CSSOverflow::Visible : below.overflowX);
    Put<PropertyId::OverflowY>(document, *body, resets ? CSSOverflow::Visible : below.overflowY);
}

}  // namespace qorvex::css
