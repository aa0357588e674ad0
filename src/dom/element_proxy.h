// What client callbacks see of an element. Made on the stack for the time of a callback: elements would carry
// a second virtual table each for the few that a client looks at, and names like GetId mean atoms inside.
#pragma once

#include <qorvex/node_proxy.h>

namespace qorvex::dom {

class Element;

class ElementProxy final : public IInputProxy {
  public:
    explicit ElementProxy(const Element& element) : element_(element) {}
    ~ElementProxy() override = default;

    const char* GetId() const override;
    unsigned GetClassCount() const override;
    const char* GetClass(unsigned index) const override;
    unsigned GetAttributeCount() const override;
    unsigned GetAttribute(const char* name, char* buffer, unsigned size) const override;
    unsigned GetAttributeAt(unsigned index, char* buffer, unsigned size) const override;
    bool HasAttribute(const char* name) const override;
    const char* GetTag() const override;
    bool HasEventListeners() const override;
    unsigned GetTextContent(char* buffer, unsigned size) const override;
    void GetBoundingClientRect(float* x, float* y, float* width, float* height) const override;

    // Text controls answer these once they have their text; any other element has none.
    const char* GetText(unsigned start) const override;
    unsigned GetCharacterRects(unsigned start, unsigned end, TextInput::Rect* rects) const override;
    void SetText(const char* text, unsigned start, unsigned end) override;
    TextInput::Selection GetSelection() const override;
    void SetSelection(const TextInput::Selection& selection) override;
    TextInput::Rect GetCaretRect() const override;

  private:
    const Element& element_;
};

}  // namespace qorvex::dom
