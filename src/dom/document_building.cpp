// From a parsed page to "load": the builder's turns, the one pause owner, deferred scripts.

#include "core/logging/log.h"
#include "core/memory/atoms.h"
#include "dom/document.h"
#include "dom/document_host.h"
#include "dom/event.h"
#include "dom/html_script_element.h"
#include "dom/preload_scan.h"
#include "dom/resource_loader.h"
#include "script/make_handle.h"

namespace qorvex::dom {

using qsl::RefPtr;

bool Document::BuildRoot(RefPtr<ParsedHTML> parsed) {
    if (!IsInDocument()) ConnectSubtree();
    UniquePtr<Builder, MemoryTag::DOM> builder = Builder::BuildRoot(parsed, *this);
    if (!builder) return false;
    if (builder_) AssertFailure("Builder already set in the Document!");
    builder_ = std::move(builder);
    return true;
}

BuildResult Document::IterateDOMBuilding() {
    if (build_state_ == BuildState::Built) return BuildResult::Finished;
    if (build_state_ == BuildState::Paused) return BuildResult::Paused;
    if (!builder_) {
        AssertFailure("Trying to iterate DOM building but there is no Builder set!");
        return BuildResult::Failed;
    }
    const RefPtr<Node> self(this);
    // The page's scripts may unload the document, and with it the builder, in the middle of a step.
    UniquePtr<Builder, MemoryTag::DOM> builder = std::move(builder_);
    const BuildResult result = builder->Step();
    if (unloaded_) return BuildResult::Finished;
    if (result != BuildResult::Finished) {
        builder_ = std::move(builder);
        return result;
    }
    if (dataBinding) dataBinding->OnDOMReady();
    build_state_ = BuildState::Built;
    builder.reset();
    host_->OnDOMBuilt(*this);
    MaybeFinishLoad();
    LogDebug("DOM built");
    return BuildResult::Finished;
}

void Document::PauseDOMBuilding(Element& owner) {
    if (build_state_ != BuildState::Building) return;
    pause_owner_ = script::WeakHandle<Node>(&owner);
    build_state_ = BuildState::Paused;
    LogDebug("Paused DOM building");
}

void Document::ResumeDOMBuilding(Element& owner) {
    const Node* expected = pause_owner_.get();
    if ((expected && expected != &owner) || build_state_ != BuildState::Paused) return;
    pause_owner_ = {};
    build_state_ = BuildState::Building;
    LogDebug("Resumed DOM building");
}

void Document::AppendDeferredScript(HTMLScriptElement& script) {
    deferred_scripts_.push_back(RefPtr<HTMLScriptElement>(&script));
}

std::string_view Document::GetReadyState() const {
    if (load_fired_) return "complete";
    return build_state_ == BuildState::Built ? "interactive" : "loading";
}

void Document::RunDeferredScripts() {
    while (!deferred_scripts_.empty()) {
        const RefPtr<HTMLScriptElement> script = deferred_scripts_.front();
        deferred_scripts_.erase(deferred_scripts_.begin());
        script->RunScript();
    }
}

bool Document::HasPendingWork() const {
    return pending_images_ > 0 || !waiting_for_images_.empty() || loader_->HasPendingWork();
}

void Document::MaybeFinishLoad() {
    if (load_fired_ || finishing_load_ || unloaded_ || build_state_ != BuildState::Built) return;
    if (HasPendingWork()) return;
    const RefPtr<Node> self(this);
    finishing_load_ = true;
    parsed_point_ = true;
    RunDeferredScripts();
    finishing_load_ = false;
    // What deferred scripts brought in belongs to the page too (HTML, "the end", step 8).
    if (unloaded_ || HasPendingWork() || host_->HasOtherLoadsPending()) return;
    FireLoad();
}

void Document::FireLoad() {
    load_fired_ = true;
    const RefPtr<Node> self(this);
    RefPtr<Event> event = script::MakeHandle<UIEvent>(this, atoms::kLoad, false, false);
    DispatchEvent(event.get());
    if (EventTarget* window = GetWindow()) {
        event = script::MakeHandle<UIEvent>(this, atoms::kLoad, false, false);
        window->DispatchEvent(event.get());
    }
    if (!unloaded_) host_->OnFinishLoad(*this);
}

}  // namespace qorvex::dom
