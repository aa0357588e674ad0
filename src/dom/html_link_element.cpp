#include "dom/html_link_element.h"

#include "core/memory/atoms.h"
#include "dom/document.h"
#include "dom/event.h"
#include "dom/resource_loader.h"
#include "script/make_handle.h"

namespace qorvex::dom {

using qsl::RefPtr;

void HTMLLinkElement::ToDebugString(NodeText& out) const {
    HTMLElement::ToDebugString(out);
    const std::pair<std::string_view, std::string_view> parts[] = {
        {" [ Rel: ", rel_}, {", Type: ", type_}, {", Href: ", href_.GetText()}, {", Media: ", media_}};
    for (const auto& [label, text] : parts) {
        out.append(label);
        out.append(text);
    }
    out.append("]");
}

void HTMLLinkElement::AttributeChanged(AttributeName name, std::optional<Atom> old_value,
                                       std::optional<Atom> new_value) {
    HTMLElement::AttributeChanged(name, old_value, new_value);
    if (name.is_data) return;
    const std::string_view value = new_value ? new_value->view() : std::string_view();
    if (name.name == atoms::kRel) {
        rel_ = value;
    } else if (name.name == atoms::kType) {
        type_ = value;
    } else if (name.name == atoms::kMedia) {
        media_ = value;
    } else if (name.name == atoms::kHref) {
        href_ = value.empty() ? URL() : GetDocument()->ResolveURL(value);
        if (applied_) GetDocument()->RemoveStyleSheet(*this);
        sheet_ = nullptr;
        loading_ = load_finished_ = applied_ = announced_ = false;
        load_id_.reset();
    } else {
        return;
    }
    TryLoadLink();
}

void HTMLLinkElement::TryLoadLink() {
    if (sheet_ || loading_ || load_finished_) return;
    if (rel_.view() != "stylesheet" || !(type_.empty() || type_.view() == "text/css") || href_.IsEmpty())
        return;
    loading_ = true;
    // A sheet that is cached arrives inside this call, before its id is known.
    const uint32_t id = GetDocument()->GetLoader().LoadAndParseStylesheet(href_, *this, false);
    if (loading_) load_id_ = id;
}

void HTMLLinkElement::OnStylesheetLoaded(uint32_t id, css::StylesheetPtr sheet) {
    // An answer to an address that the element no longer has.
    if (!loading_ || (load_id_ && *load_id_ != id)) return;
    const RefPtr<Node> self(this);
    loading_ = false;
    load_id_.reset();
    sheet_ = std::move(sheet);
    load_finished_ = true;
    ApplyLink();
}

void HTMLLinkElement::OnSubtreeInserted() {
    HTMLElement::OnSubtreeInserted();
    ApplyLink();
}

// As on the web, a sheet counts while its element is in the document.
void HTMLLinkElement::OnSubtreeRemoved() {
    if (applied_) GetDocument()->RemoveStyleSheet(*this);
    applied_ = false;
    HTMLElement::OnSubtreeRemoved();
}

void HTMLLinkElement::ApplyLink() {
    if (applied_ || !load_finished_ || !IsInDocument()) return;
    const RefPtr<Node> self(this);
    Document& document = *GetDocument();
    if (sheet_) {
        applied_ = true;
        document.AddStyleSheet(*this, sheet_, media_);
    }
    if (announced_) return;
    announced_ = true;
    RefPtr<Event> event =
        script::MakeHandle<Event>(&document, sheet_ ? atoms::kLoad : atoms::kError, false, false);
    DispatchEvent(event.get());
}

}  // namespace qorvex::dom
