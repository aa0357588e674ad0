// The HTML layer of an element: box, dataset, localisation, offsets. Every tag without a class of its own is
// a plain HTMLElement.
#pragma once

#include "dom/element.h"

namespace qorvex::dom {

class DOMStringMap;

class HTMLElement : public Element {
  public:
    HTMLElement(Document& document, css::TagId tag);

    // Made on first use and kept, so that script sees one object: most elements are never asked.
    RefPtr<DOMStringMap> GetDataset();

    Element* GetOffsetParent() const;
    float GetOffsetTop() const;
    float GetOffsetLeft() const;
    float GetOffsetWidth() const;
    float GetOffsetHeight() const;

    bool HasLocalizedContent() const override;
    void ApplyLocalization() override;
    void AttributeChanged(Atom name, std::optional<Atom> old_value, std::optional<Atom> new_value) override;
    RefPtr<Node> CloneNode(bool deep) override;
    void OnInsertedIntoDocument() override;

  protected:
    ~HTMLElement() override;
    // The display element of the class; made when the element comes into the document without one.
    virtual RefPtr<dsp::IDisplayElement> CreateDisplayElement();
    void FinishClone(HTMLElement& clone, bool deep);

  private:
    RefPtr<DOMStringMap> dataset_map_;
};

}  // namespace qorvex::dom
