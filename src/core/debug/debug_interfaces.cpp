#include "core/debug/debug_interfaces.h"

#include "core/logging/log.h"
#include "core/memory/thread_scope.h"
#include "core/view_impl.h"
#include "css/style/computed_serializer.h"
#include "dom/style_engine.h"
#include "resources/resource_context.h"
#include "resources/url_key.h"

namespace qorvex {

namespace {

ViewImpl& Impl(View* view) {
    return static_cast<ViewImpl&>(*view);
}

void ReportBox(dom::Element& element, ElementBoxCallback callback, void* user_data) {
    String tag(element.GetMarkupName().view());
    for (char& c : tag)
        c = ToLowerASCII(c);
    ElementBox box;
    box.Tag = tag.c_str();
    box.Id = element.GetId().c_str();
    const layout::Rect rect = element.GetBoundingBox();
    box.X = rect.x;
    box.Y = rect.y;
    box.Width = rect.width;
    box.Height = rect.height;
    callback(user_data, box);
}

}  // namespace

void* DebugInterfaces::Get(unsigned id) {
    switch (id) {
        case kCacheSimFeature:
            return static_cast<ICacheSimAccess*>(&cache_sim_);
        case kLayoutDebuggingFeature:
            return static_cast<ILayoutDebugging*>(&layout_debugging_);
        case kFrameStatsFeature:
            return static_cast<IFrameStats*>(&frame_stats_);
        case kDebugFeature:
            return static_cast<IDebugInterface*>(&debug_);
        default:
            return nullptr;
    }
}

void FrameStatsInterface::SetEnabled(View* view, bool enabled) {
    if (view) Impl(view).GetFrameStats().SetEnabled(enabled);
}

bool FrameStatsInterface::GetFrame(View* view, uint32_t frame_id, FrameStats* out) {
    return view && Impl(view).GetFrameStats().Get(frame_id, out);
}

bool DebugInterface::VisitElementBoxes(View* view, ElementBoxCallback callback, void* user_data) {
    ThreadScope scope;
    dom::Document* document = view ? Impl(view).GetDocument() : nullptr;
    dom::Element* body = document ? document->GetBodyElement() : nullptr;
    if (!document) return false;
    for (dom::Node* node = body; node; node = node->GetNextInTree(body))
        if (node->IsElement()) ReportBox(static_cast<dom::Element&>(*node), callback, user_data);
    return true;
}

bool DebugInterface::VisitComputedStyle(View* view, const char* selector, StyleCallback callback,
                                        void* user_data) {
    ThreadScope scope;
    dom::Document* document = view ? Impl(view).GetDocument() : nullptr;
    if (!document || !selector) return false;
    dom::Element* element = document->GetStyleEngine().QuerySelector(*document, selector);
    if (!element) return false;
    css::CssString value;
    for (size_t i = 0; i < css::kLonghandCount; ++i) {
        const auto id = static_cast<css::PropertyId>(i);
        value.clear();
        css::SerialiseComputed(id, element->GetStyle(), value);
        callback(user_data, String(css::PropertyName(id)).c_str(), value.c_str());
    }
    return true;
}

unsigned DebugInterface::GetPendingWork(View* view) {
    if (!view) return 0;
    const ViewServices& services = Impl(view).GetServices();
    // Requests first: the work that an answer leads to is queued before the request is discounted.
    const uint32_t requests = services.resources->GetOpenRequests();
    return requests + services.tasks->GetPendingTasks(TaskChannels::Resources);
}

bool DebugInterface::IsLoaded(View* view) {
    dom::Document* document = view ? Impl(view).GetDocument() : nullptr;
    return document && document->IsLoadFired();
}

bool DebugInterface::HasChanged(View* view) {
    return view && Impl(view).HasPushedFrame();
}

void DebugInterface::SetConsoleCallback(ConsoleCallback callback, void* user_data) {
    console_callback_ = callback;
    console_user_data_ = user_data;
}

bool DebugInterface::ForwardConsoleLine(const ConsoleMessage& message) const {
    if (!console_callback_) return false;
    console_callback_(console_user_data_, message);
    return true;
}

void LayoutDebugging::SetFlexAlgorithm(View* view, unsigned algorithm) {
    const bool internal = algorithm == 1;
    if (internal)
        LogDebug("Setting flex algorithm to Internal implementation");
    else
        LogDebug("Setting flex algorithm to Yoga");
    if (view)
        Impl(view).SetFlexAlgorithm(internal ? layout::FlexAlgorithm::Internal : layout::FlexAlgorithm::Yoga);
}

}  // namespace qorvex
