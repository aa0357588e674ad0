#include "dom/element_proxy.h"

#include "core/logging/log.h"
#include "dom/document.h"
#include "dom/element.h"

namespace qorvex::dom {

namespace {

// Writes as much as fits with a terminator; answers the whole length.
unsigned CopyText(std::string_view text, char* buffer, unsigned size) {
    if (buffer && size > 0) {
        const size_t fits = std::min<size_t>(text.size(), size - 1);
        std::copy_n(text.data(), fits, buffer);
        buffer[fits] = '\0';
    }
    return static_cast<unsigned>(text.size());
}

void ReportMissing(const char* operation) {
    LogWarning("IInputProxy::", operation, " is not available in this build");
}

}  // namespace

const char* ElementProxy::GetId() const {
    return element_.GetId().c_str();
}

unsigned ElementProxy::GetClassCount() const {
    return static_cast<unsigned>(element_.GetClasses().size());
}

const char* ElementProxy::GetClass(unsigned index) const {
    const auto classes = element_.GetClasses();
    return index < classes.size() ? classes[index].c_str() : "";
}

unsigned ElementProxy::GetAttributeCount() const {
    return static_cast<unsigned>(element_.GetAttributeCount());
}

unsigned ElementProxy::GetAttribute(const char* name, char* buffer, unsigned size) const {
    NodeText room;
    return CopyText(element_.GetAttributeText(name ? name : "", room).value_or(""), buffer, size);
}

unsigned ElementProxy::GetAttributeAt(unsigned index, char* buffer, unsigned size) const {
    unsigned length = CopyText({}, buffer, size);
    element_.ForEachAttribute([&](std::string_view, std::string_view value) {
        if (index-- != 0) return true;
        length = CopyText(value, buffer, size);
        return false;
    });
    return length;
}

bool ElementProxy::HasAttribute(const char* name) const {
    return element_.HasAttribute(name ? name : "");
}

const char* ElementProxy::GetTag() const {
    return element_.GetMarkupName().c_str();
}

bool ElementProxy::HasEventListeners() const {
    return const_cast<Element&>(element_).GetEventListeners(false) != nullptr;
}

unsigned ElementProxy::GetTextContent(char* buffer, unsigned size) const {
    return CopyText(element_.GetTextContent(), buffer, size);
}

void ElementProxy::GetBoundingClientRect(float* x, float* y, float* width, float* height) const {
    const layout::Rect box = element_.GetBoundingBox();
    if (x) *x = box.x;
    if (y) *y = box.y;
    if (width) *width = box.width;
    if (height) *height = box.height;
}

const char* ElementProxy::GetText(unsigned) const {
    ReportMissing("GetText");
    return "";
}

unsigned ElementProxy::GetCharacterRects(unsigned, unsigned, TextInput::Rect*) const {
    ReportMissing("GetCharacterRects");
    return 0;
}

void ElementProxy::SetText(const char*, unsigned, unsigned) {
    ReportMissing("SetText");
}

TextInput::Selection ElementProxy::GetSelection() const {
    ReportMissing("GetSelection");
    return {};
}

void ElementProxy::SetSelection(const TextInput::Selection&) {
    ReportMissing("SetSelection");
}

TextInput::Rect ElementProxy::GetCaretRect() const {
    ReportMissing("GetCaretRect");
    return {};
}

}  // namespace qorvex::dom
