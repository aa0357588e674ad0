// <style>: its text becomes a sheet of the document. The parser's elements are parsed on a resource thread
// while the building waits; those that script makes are parsed at once when they are inserted.
#pragma once

#include "dom/html_element.h"

namespace qorvex::dom {

class HTMLStyleElement final : public HTMLElement {
    QORVEX_SCRIPT_CLASS(HTMLStyleElement)
  public:
    HTMLStyleElement(Document& document, css::TagId tag) : HTMLElement(document, tag) {}
    // The element was made by the parser, with this text.
    void StartFromParser(std::string_view text);

    void OnSubtreeInserted() override;
    void OnSubtreeRemoved() override;
    void OnStylesheetLoaded(uint32_t id, css::StylesheetPtr sheet) override;

  protected:
    ~HTMLStyleElement() override = default;

  private:
    void Apply();

    css::StylesheetPtr sheet_;
    bool applied_ = false;
    bool synchronous_ = true;
};

}  // namespace qorvex::dom
