#include "dom/document.h"

#include "dom/attr.h"
#include "dom/character_data.h"
#include "dom/document_fragment.h"
#include "dom/event.h"
#include "dom/node_list.h"
#include "dom/style_sheet_list.h"
#include "script/bindings/bound_classes.h"
#include "script/bindings/custom_event.h"
#include "script/bindings/event_handler_attribute.h"
#include "script/bindings/unavailable.h"
#include "script/member_callbacks.h"

namespace qorvex::script {

namespace {

using dom::Document;
using dom::Element;
using qsl::RefPtr;
using Bind = Binding<Document>;

// The engine knows pages of one kind only.
std::string_view GetCompatMode(Document&) {
    return "CSS1Compat";
}
std::string_view GetCharacterSet(Document&) {
    return "UTF-8";
}
std::string_view GetContentType(Document&) {
    return "text/html";
}
String GetOrigin(Document& document) {
    return document.GetURL().GetOriginLikePart(true);
}
JSValueRef GetDefaultView(Document&, ScriptCall& call) {
    return JSContextGetGlobalObject(call.context);
}
dom::StyleSheetList* GetStyleSheets(Document& document) {
    return &document.GetStyleSheets();
}
// A view has the input of the game as long as it exists.
bool HasFocus(Document&) {
    return true;
}

RefPtr<Element> CreateElementNS(Document& document, JSValueRef, std::string_view name) {
    return document.CreateElement(name);
}
RefPtr<dom::Attr> CreateAttributeNS(Document& document, JSValueRef, std::string_view name) {
    return document.CreateAttribute(name);
}
RefPtr<dom::Event> CreateEvent(Document& document, std::string_view name) {
    if (name == "CustomEvent") return MakeHandle<dom::CustomEvent>(&document, Atom(), false, false);
    return document.CreateEvent(name);
}
// An element without an id is not the element with the empty one.
Element* GetElementById(Document& document, std::string_view id) {
    return id.empty() ? nullptr : document.GetElementById(id);
}
RefPtr<dom::HTMLCollection> GetElementsByTagName(Document& document, std::string_view name) {
    return document.GetElementsByTagName(document, name);
}
RefPtr<dom::HTMLCollection> GetElementsByClassName(Document& document, std::string_view name) {
    return document.GetElementsByClassName(document, name);
}

constexpr AttributeDescription kAttributes[] = {
    Bind::ReadOnly<&Document::GetURLText>("URL"),
    Bind::ReadOnly<&Document::GetURLText>("documentURI"),
    Bind::ReadOnly<&GetOrigin>("origin"),
    Bind::ReadOnly<&GetCompatMode>("compatMode"),
    Bind::ReadOnly<&GetCharacterSet>("characterSet"),
    Bind::ReadOnly<&GetCharacterSet>("charset"),
    Bind::ReadOnly<&GetCharacterSet>("inputEncoding"),
    Bind::ReadOnly<&GetContentType>("contentType"),
    Bind::ReadOnly<&Document::GetDoctype>("doctype"),
    Bind::ReadOnly<&Document::GetBodyElement>("body"),
    Bind::ReadOnly<&Document::GetDocumentElement>("documentElement"),
    Bind::ReadOnly<&GetDefaultView>("defaultView"),
    Bind::ReadOnly<&Document::GetHeadElement>("head"),
    Bind::ReadOnly<&Document::GetReadyState>("readyState"),
    Bind::ReadOnly<&Document::GetFocusedElementOrBody>("activeElement"),
    Bind::ReadOnly<&Document::GetCurrentScript>("currentScript"),
    Bind::ReadOnly<&GetStyleSheets>("styleSheets"),
};

constexpr MethodDescription kMethods[] = {
    Bind::Method<"caretPositionFromPoint", &NotAvailable<Document, "Document::CaretPositionFromPoint">, 2>(),
    Bind::Method<"createAttribute", &Document::CreateAttribute, 1>(),
    Bind::Method<"createAttributeNS", &CreateAttributeNS, 2>(),
    Bind::Method<"createComment", &Document::CreateComment, 1>(),
    Bind::Method<"createDocumentFragment", &Document::CreateDocumentFragment>(),
    Bind::Method<"createElement", &Document::CreateElement, 1>(),
    Bind::Method<"createElementNS", &CreateElementNS, 2>(),
    Bind::Method<"createEvent", &CreateEvent, 1>(),
    Bind::Method<"createNodeIterator", &NotAvailable<Document, "Document::CreateNodeIterator">, 1>(),
    Bind::Method<"createTextNode", &Document::CreateTextNode>(),
    Bind::Method<"elementFromPoint", &NotAvailable<Document, "Document::ElementFromPoint">, 2>(),
    Bind::Method<"elementsFromPoint", &NotAvailable<Document, "Document::ElementsFromPoint">, 2>(),
    Bind::Method<"getElementById", &GetElementById, 1>(),
    Bind::Method<"getElementsByClassName", &GetElementsByClassName, 1>(),
    Bind::Method<"getElementsByName", &Document::GetElementsByName>(),
    Bind::Method<"getElementsByTagName", &GetElementsByTagName, 1>(),
    Bind::Method<"getSelection", &NotAvailable<Document, "Document::GetSelection">>(),
    Bind::Method<"hasFocus", &HasFocus>(),
    Bind::Method<"importNode", &Document::ImportNode, 1>(),
    Bind::Method<"querySelector", &Element::QuerySelector, 1>(),
    Bind::Method<"querySelectorAll", &Element::QuerySelectorAll, 1>(),
    Bind::Method<"registerElement", &NotAvailable<Document, "Document::RegisterElement">, 1>(),
    Bind::Method<"write", &Document::Write, 1>(),
};

}  // namespace

const ClassDescription kDocumentClass = {.script_class = ScriptClass::Document,
                                         .attributes = kAttributes,
                                         .shared_attributes = kCommonEventHandlers,
                                         .methods = kMethods};

}  // namespace qorvex::script
