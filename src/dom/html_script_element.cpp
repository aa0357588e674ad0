#include "dom/html_script_element.h"

#include "core/memory/atoms.h"
#include "dom/document.h"
#include "dom/document_host.h"
#include "dom/event.h"
#include "dom/resource_loader.h"
#include "script/make_handle.h"

namespace qorvex::dom {

using qsl::RefPtr;

RefPtr<Node> HTMLScriptElement::AppendChild(RefPtr<Node> child) {
    const RefPtr<Node> self(this);
    RefPtr<Node> appended = HTMLElement::AppendChild(std::move(child));
    if (appended) {
        if (const std::optional<std::string_view> text = appended->GetNodeValue()) source_.append(*text);
        ProcessScript();
    }
    return appended;
}

void HTMLScriptElement::AttributeChanged(AttributeName name, std::optional<Atom> old_value,
                                         std::optional<Atom> new_value) {
    HTMLElement::AttributeChanged(name, old_value, new_value);
    if (name.is_data || state_ != State::Idle) return;
    if (name.name == atoms::kSrc) {
        if (new_value && !new_value->empty()) {
            url_ = GetDocument()->ResolveURL(new_value->view());
            ProcessScript();
        } else {
            url_ = URL();
        }
    } else if (name.name == atoms::kAsync) {
        async_ = new_value && *new_value != atoms::kFalse;
    } else if (name.name == atoms::kDefer) {
        defer_ = new_value && *new_value != atoms::kFalse;
    } else if (name.name == atoms::kType) {
        const std::string_view type = new_value ? new_value->view() : "text/javascript";
        kind_ = type == "text/javascript" ? Kind::Classic : type == "module" ? Kind::Module : Kind::NotScript;
    }
}

void HTMLScriptElement::OnSubtreeInserted() {
    HTMLElement::OnSubtreeInserted();
    ProcessScript();
}

void HTMLScriptElement::ProcessScript() {
    if (state_ != State::Idle || !IsInDocument()) return;
    if (kind_ == Kind::NotScript) {
        state_ = State::Done;
    } else if (!url_.IsEmpty()) {
        LoadScript();
    } else if (!source_.empty()) {
        state_ = State::Ready;
        RunScript();
    }
}

void HTMLScriptElement::LoadScript() {
    Document& document = *GetDocument();
    if (kind_ == Kind::Module) defer_ = true;
    state_ = State::Loading;
    const bool waits = defer_ && !document.HasPassedParsedPoint();
    if (waits) document.AppendDeferredScript(*this);
    if (kind_ == Kind::Classic) {
        document.GetLoader().LoadResource(url_, *this, async_ || defer_);
    } else if (!waits) {
        // A module is never fetched nor run here; late ones report at once what the others do when deferred
        // scripts run.
        state_ = State::Ready;
        RunScript();
    }
}

void HTMLScriptElement::OnResourceLoaded(uint32_t, const ILoadedResource* resource) {
    OnScriptLoaded(resource);
}

void HTMLScriptElement::OnScriptLoaded(const ILoadedResource* resource) {
    if (state_ != State::Loading) return;
    const RefPtr<Node> self(this);
    if (resource && resource->Succeeded()) {
        const auto data = resource->GetData();
        source_ = std::string_view(reinterpret_cast<const char*>(data.data()), data.size());
        state_ = State::Ready;
    } else {
        state_ = State::Failed;
    }
    if (!defer_ || GetDocument()->HasPassedParsedPoint()) RunScript();
}

void HTMLScriptElement::RunScript() {
    if (state_ == State::Done || (state_ == State::Loading && kind_ == Kind::Classic)) return;
    const RefPtr<Node> self(this);
    Document& document = *GetDocument();
    const bool failed = state_ == State::Failed;
    // Done before anything runs: the script's own code may move the element about.
    state_ = State::Done;
    if (!failed && kind_ == Kind::Classic) Evaluate();
    RefPtr<Event> event =
        script::MakeHandle<Event>(&document, failed ? atoms::kError : atoms::kLoad, false, false);
    DispatchEvent(event.get());
}

void HTMLScriptElement::Evaluate() {
    Document& document = *GetDocument();
    const RefPtr<Node> document_held(&document);
    const RefPtr<Element> outer(document.GetCurrentScript());
    document.SetCurrentScript(this);
    document.GetHost().EvaluateScript(document, source_,
                                      !url_.IsEmpty() ? url_.GetText() : document.GetURLText());
    document.SetCurrentScript(outer.get());
}

void HTMLScriptElement::CopyStateTo(HTMLElement& clone) const {
    auto& script = static_cast<HTMLScriptElement&>(clone);
    script.source_ = source_;
    // A clone of a script that ran does not run again. One that still loads has no request of its own.
    script.state_ = state_ == State::Loading ? State::Idle : state_;
}

}  // namespace qorvex::dom
