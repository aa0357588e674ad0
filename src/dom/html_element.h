// The HTML layer of an element: box, dataset, localisation, offsets. Every tag without a class of its own is
// a plain HTMLElement.
#pragma once

#include "dom/element.h"

namespace qorvex::dom {

class DOMStringMap;

class HTMLElement : public Element {
    QORVEX_SCRIPT_CLASS(HTMLElement)
  public:
    HTMLElement(Document& document, css::TagId tag, uint32_t extra_flags = 0)
        : Element(document, tag, kDisplayable | extra_flags) {}

    qsl::RefPtr<DOMStringMap> GetDatasetMap();

    // The nearest positioned ancestor, else the body; null for the body itself and without a box.
    Element* GetOffsetParent() const;
    float GetOffsetTop() const;
    float GetOffsetLeft() const;
    float GetOffsetWidth() const;
    float GetOffsetHeight() const;

    bool HasLocalizedContent() const override;
    void ApplyLocalization() override;
    void AttributeChanged(AttributeName name, std::optional<Atom> old_value,
                          std::optional<Atom> new_value) override;
    // An element of the same class, made by the factory.
    qsl::RefPtr<Node> CloneNode(bool deep) override;
    void OnInsertedIntoDocument() override;

  protected:
    ~HTMLElement() override;
    // The display element of the class; made when the element comes into the document without one.
    virtual dsp::DisplayElementPtr CreateDisplayElement();
    // What a clone takes over beyond attributes, style and children.
    virtual void CopyStateTo(HTMLElement&) const {}
};

}  // namespace qorvex::dom
