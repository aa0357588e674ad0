// The element classes whose own behaviour is small or comes with a subsystem of its own (controls,
// canvas, media, custom elements). Each is a plain HTMLElement otherwise.
#pragma once

#include "dom/html_element.h"

namespace qorvex::dom {

// X(Class, extra node flags)
#define QORVEX_PLAIN_HTML_ELEMENTS(X)    \
    X(HTMLPreElement, 0)                 \
    X(HTMLDivElement, 0)                 \
    X(HTMLSpanElement, 0)                \
    X(HTMLUnknownElement, 0)             \
    X(HTMLButtonElement, kIsFormControl) \
    X(HTMLSourceElement, 0)              \
    X(HTMLCanvasElement, 0)              \
    X(HTMLTextAreaElement, kIsFormControl)

#define QORVEX_DECLARE(Class, flags)                                                     \
    class Class final : public HTMLElement {                                             \
        QORVEX_SCRIPT_CLASS(Class)                                                       \
      public:                                                                            \
        Class(Document& document, css::TagId tag) : HTMLElement(document, tag, flags) {} \
    };
QORVEX_PLAIN_HTML_ELEMENTS(QORVEX_DECLARE)
#undef QORVEX_DECLARE

// With the attribute qor-inline its text and inline boxes share lines.
class HTMLParagraphElement final : public HTMLElement {
    QORVEX_SCRIPT_CLASS(HTMLParagraphElement)
  public:
    HTMLParagraphElement(Document& document, css::TagId tag) : HTMLElement(document, tag) {}

  protected:
    void AttributeChanged(AttributeName name, std::optional<Atom> old_value,
                          std::optional<Atom> new_value) override;
    dsp::DisplayElementPtr CreateDisplayElement() override;
};

// The root of a page. Its layout handle is the root of the layout tree.
class HTMLHtmlElement final : public HTMLElement {
    QORVEX_SCRIPT_CLASS(HTMLHtmlElement)
  public:
    HTMLHtmlElement(Document& document, css::TagId tag);
    layout::HandlePtr CreateLayoutNode(layout::LayoutTree& tree, layout::LayoutHandle& parent) override;

  protected:
    ~HTMLHtmlElement() override;
    dsp::DisplayElementPtr CreateDisplayElement() override;
};

class HTMLHeadElement final : public HTMLElement {
    QORVEX_SCRIPT_CLASS(HTMLHeadElement)
  public:
    HTMLHeadElement(Document& document, css::TagId tag);

  protected:
    ~HTMLHeadElement() override;
};

class HTMLTitleElement final : public HTMLElement {
    QORVEX_SCRIPT_CLASS(HTMLTitleElement)
  public:
    HTMLTitleElement(Document& document, css::TagId tag) : HTMLElement(document, tag) {
        SetFlag(kDisplayable, false);
    }
};

class HTMLBodyElement final : public HTMLElement {
    QORVEX_SCRIPT_CLASS(HTMLBodyElement)
  public:
    HTMLBodyElement(Document& document, css::TagId tag);

  protected:
    ~HTMLBodyElement() override;
    dsp::DisplayElementPtr CreateDisplayElement() override;
};

class HTMLInputElement final : public HTMLElement {
    QORVEX_SCRIPT_CLASS(HTMLInputElement)
  public:
    HTMLInputElement(Document& document, css::TagId tag) : HTMLElement(document, tag, kIsFormControl) {}
    bool HasTabIndex() const override { return true; }
};

class HTMLMediaElement : public HTMLElement {
    QORVEX_SCRIPT_CLASS(HTMLMediaElement)
  public:
    HTMLMediaElement(Document& document, css::TagId tag) : HTMLElement(document, tag) {}
};

class HTMLVideoElement final : public HTMLMediaElement {
    QORVEX_SCRIPT_CLASS(HTMLVideoElement)
  public:
    using HTMLMediaElement::HTMLMediaElement;
};

// The `a` element.
class DOM_A final : public HTMLElement {
  public:
    DOM_A(Document& document, css::TagId tag) : HTMLElement(document, tag, kIsLink) {}
    // A click goes where href says.
    void PostDispatch(Event& event) override;
};

// A tag with a hyphen. Definitions, which upgrade it, come with the custom element registry.
class CustomElement final : public HTMLElement {
  public:
    CustomElement(Document& document, Atom name) : HTMLElement(document, css::TagId::Custom), name_(name) {}
    Atom GetMarkupName() const override { return name_; }
    void ToDebugString(NodeText& out) const override;

  private:
    Atom name_;  // lower case
};

}  // namespace qorvex::dom
