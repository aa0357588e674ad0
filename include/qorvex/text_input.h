// Text controls and the client's input method and clipboard.
#pragma once

#include <qorvex/node_proxy.h>

namespace qorvex {

struct TextInputControlType {
    // What has the focus: a text control, or anything else.
    enum ControlType : unsigned { TextControl = 0, NoTextControl = 1 };
};

// Told of the focus and the edits of text controls, on the main thread, at the end of the public call that
// caused them. The proxy is valid during the call only.
class ITextInputHandler {
  public:
    virtual ~ITextInputHandler() = default;
    virtual void OnFocus(IInputProxy* proxy) { (void)proxy; }
    virtual void OnBlur(IInputProxy* proxy) { (void)proxy; }
    // Texts are null when empty; counts and index are in characters.
    virtual void OnTextChanged(IInputProxy* proxy, const char* addedChars, unsigned addedCount,
                               const char* removedChars, unsigned removedCount, unsigned index) {
        (void)proxy, (void)addedChars, (void)addedCount, (void)removedChars, (void)removedCount, (void)index;
    }
    virtual void OnSelectionChanged(IInputProxy* proxy, const TextInput::Selection& selection) {
        (void)proxy, (void)selection;
    }
};

// Receives the clipboard's text from IViewListener::OnClipboardTextGet. Implemented by the engine; valid
// during the callback only. The text is copied.
class IClipboardData {
  public:
    virtual void Set(const char* text, unsigned length) = 0;

  protected:
    virtual ~IClipboardData() = default;
};

}  // namespace qorvex
