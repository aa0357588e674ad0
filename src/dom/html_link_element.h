// <link>: a stylesheet by its address. Other relations are kept and do nothing.
#pragma once

#include "core/url/url.h"
#include "dom/html_element.h"

namespace qorvex::dom {

class HTMLLinkElement final : public HTMLElement {
    QORVEX_SCRIPT_CLASS(HTMLLinkElement)
  public:
    HTMLLinkElement(Document& document, css::TagId tag) : HTMLElement(document, tag) {}

    void ToDebugString(NodeText& out) const override;
    void AttributeChanged(AttributeName name, std::optional<Atom> old_value,
                          std::optional<Atom> new_value) override;
    void OnSubtreeInserted() override;
    void OnSubtreeRemoved() override;
    void OnStylesheetLoaded(uint32_t id, css::StylesheetPtr sheet) override;

  private:
    void TryLoadLink();
    void ApplyLink();

    NodeText rel_;
    NodeText type_;
    NodeText media_;
    URL href_;
    css::StylesheetPtr sheet_;
    std::optional<uint32_t> load_id_;  // of the request under way
    bool loading_ = false;
    bool load_finished_ = false;
    bool announced_ = false;  // "load" or "error" went out for this address
    bool applied_ = false;    // the document has the sheet
};

}  // namespace qorvex::dom
