// Text, comments, fragments and attributes: the small nodes.
#include "dom/attr.h"
#include "dom/character_data.h"
#include "dom/document.h"
#include "dom/document_fragment.h"
#include "script/bindings/bound_classes.h"
#include "script/bindings/construction.h"
#include "script/member_callbacks.h"

namespace qorvex::script {

namespace {

using dom::CharacterData;

using Bind = Binding<CharacterData>;
constexpr AttributeDescription kAttributes[] = {
    Bind::ReadOnly<&CharacterData::GetLength>("length"),
    Bind::ReadOnly<&dom::Node::GetPreviousElementSibling>("previousElementSibling"),
    Bind::ReadOnly<&dom::Node::GetNextElementSibling>("nextElementSibling"),
    Bind::ReadWrite<&CharacterData::GetData, &CharacterData::SetData>("data"),
};
constexpr MethodDescription kMethods[] = {
    Bind::Method<"appendData", &CharacterData::AppendData, 1>(),
    Bind::Method<"deleteData", &CharacterData::DeleteData, 2>(),
    Bind::Method<"insertData", &CharacterData::InsertData, 2>(),
    Bind::Method<"replaceData", &CharacterData::ReplaceData, 3>(),
    Bind::Method<"substringData", &CharacterData::SubstringData, 2>(),
};

// The text is that of its neighbours as well: https://dom.spec.whatwg.org/#dom-text-wholetext
dom::NodeText GetWholeText(dom::Text& text) {
    dom::Node* first = &text;
    while (dom::Node* previous = first->GetPreviousSibling()) {
        if (!previous->IsText()) break;
        first = previous;
    }
    dom::NodeText whole;
    for (dom::Node* node = first; node && node->IsText(); node = node->GetNextSibling()) {
        whole.append(static_cast<dom::Text*>(node)->GetData());
    }
    return whole;
}

using BindText = Binding<dom::Text>;
constexpr AttributeDescription kTextAttributes[] = {BindText::ReadOnly<&GetWholeText>("wholeText")};
constexpr MethodDescription kTextMethods[] = {BindText::Method<"splitText", &dom::Text::SplitText, 1>()};

using BindAttr = Binding<dom::Attr>;
// Null: attributes have no namespace here.
std::optional<std::string_view> GetNamespaceURI(dom::Attr&) {
    return std::nullopt;
}
constexpr AttributeDescription kAttrAttributes[] = {
    BindAttr::ReadOnly<&GetNamespaceURI>("namespaceURI"),
    BindAttr::ReadOnly<&dom::Attr::GetPrefix>("prefix"),
    BindAttr::ReadOnly<&dom::Attr::GetName>("localName"),
    BindAttr::ReadOnly<&dom::Attr::GetName>("name"),
    BindAttr::ReadWrite<&dom::Attr::GetValue, &dom::Attr::SetValue>("value"),
};

qsl::RefPtr<dom::Text> NewText(dom::Document& document, ConstructorCall& call) {
    return document.CreateTextNode(call.TextAt(0));
}
qsl::RefPtr<dom::Comment> NewComment(dom::Document& document, ConstructorCall& call) {
    return document.CreateComment(call.TextAt(0));
}
qsl::RefPtr<dom::DocumentFragment> NewFragment(dom::Document& document, ConstructorCall&) {
    return document.CreateDocumentFragment();
}

}  // namespace

const ClassDescription kCharacterDataClass = {
    .script_class = ScriptClass::CharacterData, .attributes = kAttributes, .methods = kMethods};
const ClassDescription kTextClass = {.script_class = ScriptClass::Text,
                                     .attributes = kTextAttributes,
                                     .methods = kTextMethods,
                                     .construct = Construct<&NewText>};
const ClassDescription kCommentClass = {.script_class = ScriptClass::Comment,
                                        .construct = Construct<&NewComment>};
const ClassDescription kDocumentFragmentClass = {.script_class = ScriptClass::DocumentFragment,
                                                 .construct = Construct<&NewFragment>};
const ClassDescription kAttrClass = {.script_class = ScriptClass::Attr, .attributes = kAttrAttributes};

}  // namespace qorvex::script
