// Content from text: innerHTML and the insertAdjacent family.

#include "core/logging/log.h"
#include "dom/ascii.h"
#include "dom/builder.h"
#include "dom/character_data.h"
#include "dom/document.h"
#include "dom/element.h"
#include "script/make_handle.h"
#include "script/scripting_context.h"

namespace qorvex::dom {

using qsl::RefPtr;

void Element::SetInnerHTML(std::string_view text) {
    const RefPtr<Node> self(this);
    RemoveAllChildren();
    if (!text.empty()) ParseFragment(text, *GetDocument(), *this);
}

// https://html.spec.whatwg.org/#the-insertadjacenthtml()-method
void Element::InsertAdjacentHTML(std::string_view position, std::string_view text) {
    if (text.empty()) return;
    const bool before = EqualsIgnoringAsciiCase(position, "beforebegin");
    const bool after = EqualsIgnoringAsciiCase(position, "afterend");
    const bool first = EqualsIgnoringAsciiCase(position, "afterbegin");
    const bool last = EqualsIgnoringAsciiCase(position, "beforeend");
    if (!before && !after && !first && !last) {
        LogWarning("Invalid position provided for InsertAdjacentHTML!");
        return;
    }
    const RefPtr<Node> self(this);
    const RefPtr<Node> parent(before || after ? GetParent() : this);
    if ((before || after) && (!parent || parent->Is(kIsDocument))) {
        script::RaiseError(GetScriptingContext(), "Modification not allowed for InsertAdjacentHTML!");
        return;
    }
    if (parent->IsElement() && parent->GetTag() == css::TagId::Html) return;

    const RefPtr<Element> body = script::MakeHandle<Element>(*GetDocument(), css::TagId::Body);
    ParseFragment(text, *GetDocument(), *body);
    const RefPtr<Node> reference(before  ? this
                                 : after ? GetNextSibling()
                                 : first ? GetFirstChild()
                                         : nullptr);
    const NodeVector parsed(body->GetChildren().begin(), body->GetChildren().end());
    for (const RefPtr<Node>& child : parsed)
        parent->InsertBefore(child, reference.get());
}

RefPtr<Node> Element::InsertAdjacent(std::string_view position, RefPtr<Node> node) {
    if (position == "afterbegin") return InsertBefore(std::move(node), GetFirstChild());
    if (position == "beforeend") return AppendChild(std::move(node));
    if (position != "beforebegin" && position != "afterend") {
        LogWarning("Invalid position provided for InsertAdjacent!");
        return nullptr;
    }
    Node* parent = GetParent();
    if (!parent) return nullptr;
    if (position == "beforebegin") return parent->InsertBefore(std::move(node), this);
    // The very end of a parent is out of reach of "afterend" here.
    Node* next = GetNextSibling();
    return next ? parent->InsertBefore(std::move(node), next) : nullptr;
}

RefPtr<Node> Element::InsertAdjacentElement(std::string_view position, RefPtr<Node> node) {
    return InsertAdjacent(position, std::move(node));
}

void Element::InsertAdjacentText(std::string_view position, std::string_view text) {
    InsertAdjacent(position, script::MakeHandle<Text>(*GetDocument(), text));
}

}  // namespace qorvex::dom
