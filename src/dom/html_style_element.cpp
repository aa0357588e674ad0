#include "dom/html_style_element.h"

#include "css/parser/convert.h"
#include "dom/document.h"
#include "dom/resource_loader.h"

namespace qorvex::dom {

using qsl::RefPtr;

void HTMLStyleElement::StartFromParser(std::string_view text) {
    synchronous_ = false;
    if (text.empty()) return;
    GetDocument()->PauseDOMBuilding(*this);
    GetDocument()->GetLoader().ParseStylesheetText(text, *this);
}

void HTMLStyleElement::OnSubtreeInserted() {
    HTMLElement::OnSubtreeInserted();
    if (synchronous_ && !sheet_ && HasChildNodes()) {
        Document& document = *GetDocument();
        sheet_ = css::MakeStylesheet(GetTextContent(), document.GetURLText(), document.GetStrings());
        SetTextContent({});
    }
    Apply();
}

void HTMLStyleElement::OnStylesheetLoaded(uint32_t, css::StylesheetPtr sheet) {
    sheet_ = std::move(sheet);
    Apply();
}

// As on the web, a sheet counts while its element is in the document.
void HTMLStyleElement::OnSubtreeRemoved() {
    if (applied_) GetDocument()->RemoveStyleSheet(*this);
    applied_ = false;
    HTMLElement::OnSubtreeRemoved();
}

void HTMLStyleElement::Apply() {
    if (applied_ || !sheet_ || !IsInDocument()) return;
    applied_ = true;
    GetDocument()->AddStyleSheet(*this, sheet_, {});
}

}  // namespace qorvex::dom
