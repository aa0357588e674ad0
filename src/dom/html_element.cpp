#include "dom/html_element.h"

#include <qorvex/text_services.h>

#include "core/memory/atoms.h"
#include "display/box.h"
#include "dom/document.h"
#include "dom/document_host.h"
#include "dom/dom_string_map.h"
#include "dom/element_factory.h"
#include "dom/html_elements.h"
#include "script/make_handle.h"

namespace qorvex::dom {

using qsl::RefPtr;

HTMLElement::~HTMLElement() {
    GetDocument()->GetLocalizedElements().erase(this);
}

RefPtr<DOMStringMap> HTMLElement::GetDatasetMap() {
    // Made on first use and kept, so that script sees one object: most elements are never asked, and the map
    // costs a weak block besides itself.
    RefPtr<DOMStringMap>& map = EnsureRareData().dataset_map;
    if (!map) map = script::MakeHandle<DOMStringMap>(*this);
    return map;
}

void HTMLElement::OnInsertedIntoDocument() {
    if (!display_element_) display_element_ = CreateDisplayElement();
    Element::OnInsertedIntoDocument();
}

dsp::DisplayElementPtr HTMLElement::CreateDisplayElement() {
    return MakeRef<dsp::Box>();
}

RefPtr<Node> HTMLElement::CloneNode(bool deep) {
    RefPtr<Element> clone = CreateElementByTag(GetTag(), GetMarkupName().view(), *GetDocument());
    CopyElementTo(*clone);
    auto& element = static_cast<HTMLElement&>(*clone);
    if (FindDataAttribute(atoms::kL10nId)) GetDocument()->GetLocalizedElements().insert(&element);
    CopyStateTo(element);
    CopyCommon(*clone, deep);
    return clone;
}

// --- Offsets. https://drafts.csswg.org/cssom-view/#extensions-to-the-htmlelement-interface

Element* HTMLElement::GetOffsetParent() const {
    const Document& document = *GetDocument();
    if (!GetLayoutResult() || this == document.GetBodyElement()) return nullptr;
    for (Node* node = GetParent(); node && node->IsElement() && !node->Is(kIsDocument);
         node = node->GetParent()) {
        const layout::LayoutHandle* handle = node->GetLayoutHandle();
        if (handle && (handle->data().flags.isPositioned || node == document.GetBodyElement()))
            return static_cast<Element*>(node);
    }
    return nullptr;
}

float HTMLElement::GetOffsetTop() const {
    const layout::LayoutResult* box = GetLayoutResult();
    if (!box) return 0;
    const Element* parent = GetOffsetParent();
    const layout::LayoutResult* outer = parent ? parent->GetLayoutResult() : nullptr;
    return outer ? box->top - outer->top - parent->GetBoxResult()->edges.border().top : box->top;
}

float HTMLElement::GetOffsetLeft() const {
    const layout::LayoutResult* box = GetLayoutResult();
    if (!box) return 0;
    const Element* parent = GetOffsetParent();
    const layout::LayoutResult* outer = parent ? parent->GetLayoutResult() : nullptr;
    return outer ? box->left - outer->left - parent->GetBoxResult()->edges.border().left : box->left;
}

float HTMLElement::GetOffsetWidth() const {
    const layout::LayoutResult* box = GetLayoutResult();
    return box ? box->width : 0;
}

float HTMLElement::GetOffsetHeight() const {
    const layout::LayoutResult* box = GetLayoutResult();
    return box ? box->height : 0;
}

// --- Localisation: data-l10n-id names a translation that replaces the content.

namespace {

class Translation final : public ITranslationData {
  public:
    void Set(const char* text, unsigned length) override { text_.emplace(std::string_view(text, length)); }
    std::optional<NodeText> Take() { return std::move(text_); }

  private:
    std::optional<NodeText> text_;
};

std::optional<NodeText> FindTranslation(const HTMLElement& element) {
    const Atom* id = element.FindDataAttribute(atoms::kL10nId);
    ILocalizationManager* manager = element.GetDocument()->GetHost().GetLocalizationManager();
    if (!id || !manager) return std::nullopt;
    Translation translation;
    manager->Translate(id->c_str(), &translation);
    if (std::optional<NodeText> text = translation.Take()) return text;
    const char* text = manager->Translate(id->c_str());
    return text ? std::optional<NodeText>(text) : std::nullopt;
}

}  // namespace

bool HTMLElement::HasLocalizedContent() const {
    return HasChildNodes() && FindTranslation(*this).has_value();
}

void HTMLElement::ApplyLocalization() {
    const std::optional<NodeText> text = FindTranslation(*this);
    if (!text) return;
    if (text->view().find_first_of("<&") != std::string_view::npos) {
        SetInnerHTML(*text);
    } else {
        SetTextContent(*text);
    }
}

void HTMLElement::AttributeChanged(AttributeName name, std::optional<Atom> old_value,
                                   std::optional<Atom> new_value) {
    if (name.is_data && name.name == atoms::kL10nId) {
        auto& localized = GetDocument()->GetLocalizedElements();
        if (old_value && !new_value) localized.erase(this);
        if (!old_value && new_value) localized.insert(this);
        ApplyLocalization();
    }
    Element::AttributeChanged(name, old_value, new_value);
}

}  // namespace qorvex::dom
