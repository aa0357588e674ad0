// Pages of a view: loading, the change of documents, and their scripts.
#include <qorvex/view_listener.h>

#include "core/api_call.h"
#include "core/logging/log.h"
#include "core/view_impl.h"
#include "css/style/style_engine.h"
#include "resources/cached_images_manager.h"
#include "resources/html_cache.h"
#include "script/bindings/context_lifecycle.h"
#include "script/evaluate.h"
#include "script/make_handle.h"

namespace qorvex {

void ViewImpl::LoadURL(const char* url) {
    const APICall call(family_, api_depth_);
    if (!call) return;
    NavigateToURL(url ? url : "");
}

void ViewImpl::Reload() {
    const APICall call(family_, api_depth_);
    if (!call) return;
    LogDebug("Reload requested on View ", id_);
    const String current(url_.GetText().view());
    NavigateToURL(current);
}

void ViewImpl::NavigateTo(const URL& url) {
    NavigateToURL(url.GetText());
}

void ViewImpl::NavigateToURL(std::string_view text) {
    if (destroying_) return;
    const String copy(text);  // the client's text may not end with a zero, and page code may run below
    if (listener_ && !listener_->OnNavigateTo(copy.c_str())) return;
    URL url;
    url.Parse(copy);
    if (url.IsEmpty() || url.IsRelative()) {
        LogError("LoadURL invoked with invalid URL: ", copy);
        return;
    }
    const URL previous = std::exchange(url_, url);
    if (intercept_all_requests_ && !IsRequestAllowed(url)) {
        LogWarning("Failed to load resource", " ", url.GetText());
        if (listener_) listener_->OnLoadFailed(url.GetText().c_str(), "Failed to load resource");
        return;
    }
    if (document_) document_->GetLoader().StopLoading();
    // A page that was left at once costs no parsing.
    if (!previous.IsEmpty() && previous != url) services_.html_cache->Unsubscribe(id_, previous);
    RequestDocument(url);
}

void ViewImpl::RequestDocument(const URL& url) {
    const uint32_t number = ++load_number_;
    load_pending_ = true;
    auto on_load = [this, number](const URL& final_url, RefPtr<dom::ParsedHTML> html) {
        family_.Push(TaskChannels::Main,
                     MakeTask("Loaded", [this, number, final_url, html = std::move(html)](TaskFamilyHandle) {
                         if (number == load_number_) OnHTMLContent(final_url, html);
                     }));
    };
    auto on_error = [this, number](const URL& failed) {
        family_.Push(TaskChannels::Main, MakeTask("LoadFailed", [this, number, failed](TaskFamilyHandle) {
                         if (number == load_number_) FailLoad(failed, "Failed to load HTML resource");
                     }));
    };
    services_.html_cache->Request(url, id_, std::move(on_load), std::move(on_error));
}

void ViewImpl::FailLoad(const URL& url, const char* error) {
    load_pending_ = false;
    if (listener_) listener_->OnLoadFailed(url.GetText().c_str(), error);
}

bool ViewImpl::IsRequestAllowed(const URL& url) {
    return !intercept_all_requests_ || !listener_ ||
           listener_->OnResourceRequestIntercepted(url.GetText().c_str()) == InterceptRequestStatus::Allow;
}

bool ViewImpl::GiveUpRequest(uint32_t id, const dom::Document& document) {
    return services_.images->GiveUpRequest(id, document);
}

void ViewImpl::OnHTMLContent(const URL& url, RefPtr<dom::ParsedHTML> html) {
    load_pending_ = false;
    if (!html) {
        AssertFailure("Got nullptr as parsed HTML");
        return;
    }
    LogDebug("View ", id_, " has new HTML content");
    UnloadDocumentNow();
    url_ = url;
    services_.resources->SetBaseURL(url);
    CreateDocument(url);
    if (!document_->BuildRoot(std::move(html))) {
        LogError("Unable to build DOM root!");
        document_->Unload();
        document_.reset();
        return;
    }
    document_->SetViewSize(width_, height_);
    MarkWholeViewDirty();
    CreateScriptContext();
    if (listener_) listener_->OnScriptContextCreated();
    RunInitialScripts();
    if (document_ && document_->GetBuildState() != dom::BuildState::Built) document_->IterateDOMBuilding();
}

void ViewImpl::CreateDocument(const URL& url) {
    auto loader =
        MakeUnique<DocumentLoader, MemoryTag::DOM>(*this, *services_.resources, *services_.stylesheet_cache);
    DocumentLoader& document_loader = *loader;
    dom::DocumentParams params;
    params.host = this;
    params.url = url;
    params.style_engine =
        MakeUnique<css::StyleEngine, MemoryTag::DOM>(*services_.strings, services_.default_rules);
    params.loader = std::move(loader);
    document_ = script::MakeHandle<dom::HTMLDocument>(std::move(params));
    document_loader.SetDocument(*document_);
}

void ViewImpl::CreateScriptContext() {
    script_context_ = script::CreateScriptingContext(*this, *document_);
}

void ViewImpl::RunInitialScripts() {
    script::RunPreludeScripts(*script_context_);
    // By index: a script may add another one.
    for (size_t i = 0; i < initial_scripts_.size() && script_context_; ++i)
        script::EvaluateScript(*script_context_, initial_scripts_[i], "");
}

void ViewImpl::UnloadDocument() {
    const APICall call(family_, api_depth_);
    if (!call) return;
    if (api_depth_ == 1) {
        UnloadDocumentNow();
        return;
    }
    // A listener asks for it: the page's script may be on the stack, so the page goes with the next results.
    family_.Push(TaskChannels::Main, MakeTask("UnloadDocument", [this] { UnloadDocumentNow(); }));
}

void ViewImpl::UnloadDocumentNow() {
    LogDebug("Unloading document from View ", id_);
    // First: answers that come in while this waits belong to loads that were asked for before.
    ++load_number_;
    WaitUntilLayoutIdle();
    if (document_) {
        document_->GetLoader().StopLoading();
        services_.tasks->Run(TaskChannels::AfterAPICall, false, nullptr, family_.family);
        document_->Unload();
    }
    update_.reset();
    if (script_context_) script::DestroyScriptingContext(std::move(script_context_));
    document_.reset();
}

void ViewImpl::EvaluateScript(dom::Document& document, std::string_view source, std::string_view source_url) {
    if (!script_context_ || &document != document_.get()) return;
    StageTimer timer(stats_, open_frame_id_, &FrameStats::Script);
    script::EvaluateScript(*script_context_, source, source_url);
}

void ViewImpl::OnDOMBuilt(dom::Document&) {
    LogDebug("DOM rebuilt on View ", id_);
    if (listener_) listener_->OnDOMBuilt();
}

void ViewImpl::OnFinishLoad(dom::Document& document) {
    if (listener_) listener_->OnFinishLoad(document.GetURL().GetText().c_str());
}

void ViewImpl::ExecuteScript(const char* source) {
    const APICall call(family_, api_depth_);
    if (!call) return;
    if (source && script_context_ && script_context_->window)
        script::EvaluateScript(*script_context_, source, "");
}

void ViewImpl::AddInitialScript(const char* source) {
    const APICall call(family_, api_depth_);
    if (!call) return;
    if (source) initial_scripts_.emplace_back(source);
}

void ViewImpl::ClearInitialScripts() {
    const APICall call(family_, api_depth_);
    if (!call) return;
    initial_scripts_.clear();
}

}  // namespace qorvex
