// The 95 classes that a page can see, in one table: enumeration, names, parents and the process-wide array of
// their JSClassRefs all derive from the rows below.
//
// Invariant: the order is that of ScriptClassTable and never changes; every class of a row's parent chain is
// in the table. The array is filled once at library start and shared by all views, so classes are immutable
// after.
#pragma once

#include <JavaScriptCore/JSBase.h>

#include <array>
#include <cstddef>
#include <cstdint>

namespace qorvex::script {

// X(class, parent class or None, finaliser kind)
#define QORVEX_SCRIPT_CLASSES(X)                       \
    X(CSSRuleList, None, StyleSheet)                   \
    X(CSSStyleDeclaration, None, StyleHolder)          \
    X(CSSStyleSheet, StyleSheet, StyleSheet)           \
    X(StyleSheet, None, StyleSheet)                    \
    X(StyleSheetList, None, StyleSheet)                \
    X(VirtualList, None, Weak)                         \
    X(Animation, None, Weak)                           \
    X(Attr, Node, Weak)                                \
    X(CanvasGradient, None, Plain)                     \
    X(CanvasPattern, None, Plain)                      \
    X(CanvasRenderingContext2D, None, Plain)           \
    X(CaretPosition, None, Plain)                      \
    X(CharacterData, Node, Weak)                       \
    X(Comment, CharacterData, Weak)                    \
    X(Console, None, Plain)                            \
    X(CustomElementRegistry, None, Plain)              \
    X(CustomEvent, Event, Event)                       \
    X(Document, Node, Node)                            \
    X(DocumentFragment, Node, Weak)                    \
    X(DocumentType, Node, Node)                        \
    X(DOMRect, DOMRectReadOnly, Rect)                  \
    X(DOMRectReadOnly, None, Plain)                    \
    X(DOMStringMap, None, Plain)                       \
    X(DOMTokenList, None, TokenList)                   \
    X(Element, Node, Node)                             \
    X(ElementDefinitionOptions, None, Plain)           \
    X(ElementRegistrationOptions, None, Plain)         \
    X(Event, None, Event)                              \
    X(EventListener, None, Plain)                      \
    X(EventTarget, None, None)                         \
    X(FocusEvent, UIEvent, Event)                      \
    X(Gamepad, None, Plain)                            \
    X(GamepadButton, None, Plain)                      \
    X(GamepadEvent, UIEvent, Event)                    \
    X(GamepadPose, None, Plain)                        \
    X(History, None, Plain)                            \
    X(HTMLBodyElement, HTMLElement, Weak)              \
    X(HTMLButtonElement, HTMLElement, Weak)            \
    X(HTMLCanvasElement, HTMLElement, Node)            \
    X(HTMLCollection, NodeList, Plain)                 \
    X(HTMLDivElement, HTMLElement, Weak)               \
    X(HTMLDocument, Document, Weak)                    \
    X(HTMLElement, Element, Weak)                      \
    X(HTMLHeadElement, HTMLElement, Weak)              \
    X(HTMLHtmlElement, HTMLElement, Weak)              \
    X(HTMLIFrameElement, HTMLElement, Weak)            \
    X(HTMLImageElement, HTMLElement, Weak)             \
    X(HTMLInputElement, HTMLElement, Weak)             \
    X(HTMLLinkElement, HTMLElement, Weak)              \
    X(HTMLParagraphElement, HTMLElement, Weak)         \
    X(HTMLPreElement, HTMLElement, Weak)               \
    X(HTMLScriptElement, HTMLElement, Weak)            \
    X(HTMLSpanElement, HTMLElement, Weak)              \
    X(HTMLStyleElement, HTMLElement, Weak)             \
    X(HTMLTextAreaElement, HTMLElement, Weak)          \
    X(HTMLTitleElement, HTMLElement, Weak)             \
    X(HTMLUnknownElement, HTMLElement, Weak)           \
    X(KeyboardEvent, UIEvent, Event)                   \
    X(Location, None, Plain)                           \
    X(MorphAnimation, None, Weak)                      \
    X(MouseEvent, UIEvent, Event)                      \
    X(MutationObserver, None, Plain)                   \
    X(MutationObserverInit, None, Plain)               \
    X(MutationRecord, None, Plain)                     \
    X(NamedNodeMap, None, Plain)                       \
    X(Navigator, None, Plain)                          \
    X(Node, EventTarget, Node)                         \
    X(NodeFilter, None, Plain)                         \
    X(NodeIterator, None, Plain)                       \
    X(NodeList, None, Plain)                           \
    X(Performance, EventTarget, Plain)                 \
    X(PopStateEvent, Event, Event)                     \
    X(ProgressEvent, Event, Event)                     \
    X(Screen, None, Plain)                             \
    X(Selection, None, Plain)                          \
    X(Storage, None, Plain)                            \
    X(SVGElement, Element, Weak)                       \
    X(Text, CharacterData, Weak)                       \
    X(Touch, None, Plain)                              \
    X(TouchEvent, UIEvent, Event)                      \
    X(TouchList, None, Plain)                          \
    X(UIEvent, Event, Event)                           \
    X(Window, EventTarget, None)                       \
    X(XMLHttpRequest, XMLHttpRequestEventTarget, Weak) \
    X(XMLHttpRequestEventTarget, EventTarget, Weak)    \
    X(Blob, None, Plain)                               \
    X(BlobPropertyBag, None, Plain)                    \
    X(URL, None, Plain)                                \
    X(MessageEvent, Event, Event)                      \
    X(WebSocket, EventTarget, Weak)                    \
    X(HTMLMediaElement, HTMLElement, Weak)             \
    X(HTMLSourceElement, HTMLElement, Weak)            \
    X(HTMLVideoElement, HTMLMediaElement, Weak)        \
    X(MediaError, None, Error)                         \
    X(TimeRanges, None, Plain)

enum class ScriptClass : uint8_t {
#define X(name, parent, finaliser) name,
    QORVEX_SCRIPT_CLASSES(X)
#undef X
        None,
};

inline constexpr size_t kScriptClassCount = static_cast<size_t>(ScriptClass::None);
static_assert(kScriptClassCount == 95);

// How an object ends when the collector takes its wrapper. All kinds but None and StyleHolder drop the
// wrapper's weight and then release as a native holder would (wrapper_table.h); where the memory goes back to
// is the business of the object's own operator delete, so the kinds differ only in what they document.
enum class Finaliser : uint8_t {
    None,
    Weak,
    Node,
    Plain,
    StyleSheet,
    Event,
    Rect,
    TokenList,
    StyleHolder,
    Error
};

struct ScriptClassRow {
    const char* name;
    ScriptClass parent;
    Finaliser finaliser;
};

inline constexpr std::array<ScriptClassRow, kScriptClassCount> kScriptClassRows = {{
#define X(name, parent, finaliser) {#name, ScriptClass::parent, Finaliser::finaliser},
    QORVEX_SCRIPT_CLASSES(X)
#undef X
}};

[[nodiscard]] constexpr const ScriptClassRow& GetScriptClassRow(ScriptClass script_class) {
    return kScriptClassRows[static_cast<size_t>(script_class)];
}

// Collections and maps whose properties are their items: the engine has to ask for each, so their objects are
// of a native class (wrapper_table.h). All others are plain objects.
[[nodiscard]] constexpr bool HasPropertyRules(ScriptClass script_class) {
    switch (script_class) {
        case ScriptClass::CSSStyleDeclaration:
        case ScriptClass::StyleSheetList:
        case ScriptClass::DOMStringMap:
        case ScriptClass::DOMTokenList:
        case ScriptClass::HTMLCollection:
        case ScriptClass::NamedNodeMap:
        case ScriptClass::NodeList:
        case ScriptClass::TouchList:
            return true;
        default:
            return false;
    }
}

namespace internal {

// Row c, bit b: b is c or one of its ancestors. 1.5 KB turn a walk up the parents into one load.
struct AncestorTable {
    uint64_t words[kScriptClassCount][2] = {};
    constexpr AncestorTable() {
        for (size_t c = 0; c < kScriptClassCount; ++c) {
            for (auto a = static_cast<ScriptClass>(c); a != ScriptClass::None;
                 a = GetScriptClassRow(a).parent) {
                words[c][static_cast<size_t>(a) / 64] |= uint64_t{1} << (static_cast<size_t>(a) % 64);
            }
        }
    }
};
inline constexpr AncestorTable kAncestors;

}  // namespace internal

// Whether `script_class` is `base` or derives from it.
[[nodiscard]] constexpr bool IsScriptClassOrDerived(ScriptClass script_class, ScriptClass base) {
    const auto b = static_cast<size_t>(base);
    return (internal::kAncestors.words[static_cast<size_t>(script_class)][b / 64] >> (b % 64)) & 1;
}

// One entry a class; null for those without property rules, before library start and after library end.
class ScriptClassTable {
  public:
    [[nodiscard]] JSClassRef operator[](ScriptClass script_class) const {
        return classes_[static_cast<size_t>(script_class)];
    }
    void Set(ScriptClass script_class, JSClassRef value) {
        classes_[static_cast<size_t>(script_class)] = value;
    }

  private:
    std::array<JSClassRef, kScriptClassCount> classes_{};
};

// The process-wide table. Filled by CreateScriptClasses (class_description.h), read by every wrapper
// creation.
[[nodiscard]] ScriptClassTable& GetScriptClassTable();

}  // namespace qorvex::script
