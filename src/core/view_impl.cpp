// The life of a view, and its plain settings.
#include "core/view_impl.h"

#include <fresco/rendering_library.h>
#include <qorvex/library.h>

#include <chrono>

#include "core/api_call.h"
#include "core/logging/log.h"
#include "layout/fonts/font_manager.h"
#include "resources/cached_images_manager.h"
#include "resources/cached_svg_manager.h"
#include "resources/html_cache.h"

namespace qorvex {

namespace {

// Channels in the order in which a view opens them.
constexpr TaskChannels kViewChannels[] = {TaskChannels::Main, TaskChannels::Layout, TaskChannels::Resources,
                                          TaskChannels::AfterAPICall, TaskChannels::ResourceEvents};

uint32_t g_next_view_id = 0;  // main thread

uint64_t RandomSeed() {
    const auto now = std::chrono::steady_clock::now().time_since_epoch();
    return static_cast<uint64_t>(std::chrono::duration_cast<std::chrono::nanoseconds>(now).count());
}

fresco::SceneParams MakeSceneParams(const ViewSettings& settings) {
    fresco::SceneParams params;
    for (size_t i = 0; i < std::size(settings.SceneParams); ++i)
        params.values[i] = settings.SceneParams[i];
    return params;
}

bool HasOption(const char* options, std::string_view option) {
    return options && std::string_view(options).find(option) != std::string_view::npos;
}

}  // namespace

ViewImpl::ViewImpl(const ViewSettings& settings, const ViewServices& services, uint32_t family)
    : services_(services),
      link_(MakeRef<RenderLink>(services.rendering->CreateScene(MakeSceneParams(settings)))),
      frame_queue_(link_->GetFrames()),
      stats_(link_->GetStats()),
      scene_(link_->GetScene()),
      family_{family, services.tasks},
      id_(g_next_view_id++),
      listener_(settings.Listener),
      text_input_handler_(settings.TextInputHandler),
      on_frame_complete_(settings.OnFrameComplete),
      get_current_time_(settings.GetCurrentTime),
      callback_user_data_(settings.CallbackUserData),
      width_(settings.Width),
      height_(settings.Height),
      double_click_interval_(settings.DoubleClickInterval),
      gesture_scroll_threshold_(settings.GestureScrollThreshold),
      complex_selectors_(settings.EnableComplexCSSSelectorsStyling),
      intercept_all_requests_(settings.InterceptAllRequests),
      asynchronous_layout_(services.use_dedicated_layout_thread || settings.ExecuteLayoutOnDedicatedThread),
      wait_for_renderer_(settings.WaitForViewRendererToRecord),
      disable_flex_basis_units_(HasOption(settings.AdditionalOptions, "--disable-flex-basis-units")),
      random_(RandomSeed()) {
    for (TaskChannels channel : kViewChannels) {
        LogTrace("Opening task channel ", static_cast<uint32_t>(channel), " on family ", family_.family);
        services_.tasks->OpenChannel(channel, family_.family);
    }
    user_agent_ = std::string_view(Library::GetDefaultUserAgent());
    LogDebug("View created #", id_, " with task family ", family_.family);
    LogDebug("View options: ");
    LogDebug("  Width: ", width_);
    LogDebug("  Height: ", height_);
    LogDebug("  Enabled Complex Selectors CSS Styling: ", complex_selectors_ ? " true" : "false");
}

ViewImpl::~ViewImpl() = default;

void ViewImpl::Destroy() {
    const MainThreadCall call("View");
    if (!call) return;
    if (IsInsideOperation()) {
        LogError("View::Destroy must not be called from inside an operation of the view");
        return;
    }
    // What runs below may call back into the view: nothing new begins, and no second Destroy.
    ++api_depth_;
    destroying_ = true;
    timers_.CancelAll();
    UnloadDocumentNow();
    services_.html_cache->UnsubscribeAll(id_);
    for (TaskChannels channel : kViewChannels)
        LogTrace("Closing task channel ", static_cast<uint32_t>(channel), " on family ", family_.family);
    services_.tasks->DestroyFamily(family_.family);
    open_frame_.reset();
    // A Paint that waits for the rest of a frame returns.
    frame_queue_.DiscardAll();
    frame_queue_.ClearFrames();
    render_caches_.ForgetResources();
    if (services_.lifetime_tracker) services_.lifetime_tracker->OnViewDestroyed(this);
    Delete<MemoryTag::General>(this);
}

void ViewImpl::MarkWholeViewDirty() {
    dirty_region_.Add(layout::MakeRect(0, 0, static_cast<float>(width_), static_cast<float>(height_)));
}

void ViewImpl::Resize(unsigned width, unsigned height) {
    const APICall call(family_, api_depth_);
    if (!call) return;
    width_ = width;
    height_ = height;
    if (document_) document_->SetViewSize(width, height);
    force_full_layout_ = true;
    MarkWholeViewDirty();
}

unsigned ViewImpl::GetWidth() const {
    const MainThreadCall call("View");
    return call ? width_ : 0;
}

unsigned ViewImpl::GetHeight() const {
    const MainThreadCall call("View");
    return call ? height_ : 0;
}

void ViewImpl::SetVirtualResolution(unsigned width, unsigned height) {
    const APICall call(family_, api_depth_);
    if (!call) return;
    if (width_ == 0 || height_ == 0) {
        AssertFailure("Unable to set virtual resolution for view of size 0!");
        return;
    }
    if (width == 0 || height == 0) {
        AssertFailure("Unable to set virtual resolution! Each dimension should be bigger than 0!");
        return;
    }
    scale_x_ = static_cast<float>(width) / static_cast<float>(width_);
    scale_y_ = static_cast<float>(height) / static_cast<float>(height_);
    MarkWholeViewDirty();
}

void ViewImpl::ClearListeners() {
    const APICall call(family_, api_depth_);
    if (!call) return;
    listener_ = nullptr;
    text_input_handler_ = nullptr;
}

void ViewImpl::EnableRendering(bool enabled) {
    const APICall call(family_, api_depth_);
    if (!call) return;
    if (enabled && !rendering_enabled_) MarkWholeViewDirty();
    rendering_enabled_ = enabled;
}

void ViewImpl::ContinuousRepaint(bool enabled) {
    const APICall call(family_, api_depth_);
    if (call) continuous_repaint_ = enabled;
}

void ViewImpl::SetPaintOption(bool enabled) {
    const APICall call(family_, api_depth_);
    if (call) paint_option_ = enabled;
}

void ViewImpl::ShowPaintRectangles(bool enabled) {
    const APICall call(family_, api_depth_);
    if (!call) return;
    if (!enabled && show_paint_rectangles_) MarkWholeViewDirty();
    show_paint_rectangles_ = enabled;
}

void ViewImpl::EnableGPUMetadataEmission(bool enabled) {
    const APICall call(family_, api_depth_);
    if (!call) return;
    if (enabled == gpu_metadata_) return;
    LogWarning(enabled ? "Enabling GPU metadata emission!" : "Disabling GPU metadata emission!");
    gpu_metadata_ = enabled;
}

float ViewImpl::GetGestureScrollThreshold() const {
    const MainThreadCall call("View");
    return call ? gesture_scroll_threshold_ : 0;
}

void ViewImpl::SetGestureScrollThreshold(float pixels) {
    const APICall call(family_, api_depth_);
    if (call) gesture_scroll_threshold_ = pixels;
}

void ViewImpl::SetUserAgent(const char* user_agent) {
    const APICall call(family_, api_depth_);
    if (!call) return;
    user_agent_ = std::string_view(user_agent ? user_agent : "");
}

void ViewImpl::SetFlexAlgorithm(layout::FlexAlgorithm algorithm) {
    flex_algorithm_ = algorithm;
    force_full_layout_ = true;
}

double ViewImpl::GetTime() const {
    return get_current_time_ ? get_current_time_(callback_user_data_, id_) : time_;
}

layout::IFontResolver* ViewImpl::GetFontResolver() {
    return services_.fonts;
}

dom::IImageLoader* ViewImpl::GetImageLoader() {
    return services_.images;
}

dom::ISVGLoader* ViewImpl::GetSVGLoader() {
    return services_.svgs;
}

void ViewImpl::RequestFrames(uint32_t count) {
    requested_frames_ = std::max(requested_frames_, count);
}

}  // namespace qorvex
