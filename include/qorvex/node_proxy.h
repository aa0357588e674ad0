// Elements as client callbacks see them.
#pragma once

namespace qorvex {

// A borrowed, read-only view of an element, valid during the callback that received it, on the main thread.
// Texts are UTF-8. Operations with a buffer return the text's length in bytes and write at most size bytes,
// with a terminator; a null buffer only asks for the length. Implemented by the engine.
class INodeProxy {
  public:
    virtual const char* GetId() const = 0;  // "" when absent
    virtual unsigned GetClassCount() const = 0;
    virtual const char* GetClass(unsigned index) const = 0;  // "" when out of range
    virtual unsigned GetAttributeCount() const = 0;
    virtual unsigned GetAttribute(const char* name, char* buffer, unsigned size) const = 0;
    virtual unsigned GetAttributeAt(unsigned index, char* buffer, unsigned size) const = 0;
    virtual bool HasAttribute(const char* name) const = 0;
    virtual const char* GetTag() const = 0;  // upper case
    virtual bool HasEventListeners() const = 0;
    virtual unsigned GetTextContent(char* buffer, unsigned size) const = 0;
    // View pixels, as getBoundingClientRect gives them to script.
    virtual void GetBoundingClientRect(float* x, float* y, float* width, float* height) const = 0;

  protected:
    virtual ~INodeProxy() = default;
};

namespace TextInput {

// Positions count characters (code points), not bytes.
struct Selection {
    enum Direction : unsigned { None = 0, Forward = 1, Backward = 2 };

    unsigned Start = 0;
    unsigned End = 0;
    Direction SelectionDirection = None;
};

struct Rect {
    float X = 0;
    float Y = 0;
    float Width = 0;
    float Height = 0;
};

}  // namespace TextInput

// A focused text control as ITextInputHandler sees it. Implemented by the engine.
class IInputProxy : public INodeProxy {
  public:
    // Text from the character start to the end; valid until the control changes.
    virtual const char* GetText(unsigned start) const = 0;
    // Writes one rectangle for each character of [start, end) to rects; returns how many were written.
    virtual unsigned GetCharacterRects(unsigned start, unsigned end, TextInput::Rect* rects) const = 0;
    // Replaces the characters of [start, end). Refused with an Error line when end lies before start.
    virtual void SetText(const char* text, unsigned start, unsigned end) = 0;
    virtual TextInput::Selection GetSelection() const = 0;
    virtual void SetSelection(const TextInput::Selection& selection) = 0;
    virtual TextInput::Rect GetCaretRect() const = 0;

  protected:
    ~IInputProxy() override = default;
};

}  // namespace qorvex
