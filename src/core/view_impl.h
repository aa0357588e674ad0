// A view: one page and the frames that it produces. The class is one, its operations live in files by theme:
// view_impl.cpp (life), view_frame.cpp (the frame cycle), view_loading.cpp (pages), view_input.cpp,
// view_caches.cpp, view_bindings.cpp, view_debug.cpp.
//
// Invariants:
// - at most one frame of the view is on the layout side; layout_unblocked_ is 0 exactly while it is;
// - the frame id grows by one with each Advance, and each id gets OnFrameComplete once;
// - everything here belongs to the main thread but what is marked otherwise.
#pragma once

#include <fresco/scene.h>
#include <qorvex/view.h>
#include <qorvex/view_settings.h>

#include <atomic>
#include <random>

#include "core/cache_requests.h"
#include "core/frame/frame_data.h"
#include "core/frame/render_link.h"
#include "core/tasks/timer.h"
#include "core/url/url.h"
#include "core/view_services.h"
#include "display/dirty_region.h"
#include "display/render_caches.h"
#include "dom/document.h"
#include "dom/document_host.h"
#include "layout/perform_layout.h"
#include "resources/document_loader.h"
#include "script/bindings/context_lifecycle.h"
#include "script/bindings/window_host.h"

namespace qorvex {

class ViewImpl final : public View,
                       public dom::IDocumentHost,
                       public dom::IWindowHost,
                       public ILoaderHost,
                       public ITimerClock {
  public:
    ViewImpl(const ViewSettings& settings, const ViewServices& services, uint32_t family);
    ~ViewImpl() override;

    // --- View, in slot order
    void Destroy() override;
    void LoadURL(const char* url) override;
    void Reload() override;
    void UnloadDocument() override;
    void ClearHistory() override;
    void Advance(double time) override;
    unsigned GetId() const override { return id_; }
    unsigned GetTaskFamilyId() const override { return family_.family; }
    void Resize(unsigned width, unsigned height) override;
    void SetVirtualResolution(unsigned width, unsigned height) override;
    unsigned GetWidth() const override;
    unsigned GetHeight() const override;
    void ClearListeners() override;
    void EnableRendering(bool enabled) override;
    void ContinuousRepaint(bool enabled) override;
    void ShowPaintRectangles(bool enabled) override;
    void SetPaintOption(bool enabled) override;
    void EnableGPUMetadataEmission(bool enabled) override;
    DebugDump* DumpDOM(unsigned flags) override;
    DebugDump* DumpStackingContexts() override;
    void TouchEvent(const TouchEventData* touches, unsigned count, bool* handled, void* user_data) override;
    void GestureEvent(const GestureEventData& data, bool* handled) override;
    void MouseEvent(const MouseEventData& data, bool* handled, void* user_data) override;
    void KeyEvent(const KeyEventData& data, bool* handled, void* user_data) override;
    bool IMESetComposition(const char* text) override;
    bool IMEConfirmComposition(const char* text) override;
    bool IMECancelComposition() override;
    float GetGestureScrollThreshold() const override;
    void SetGestureScrollThreshold(float pixels) override;
    void SetUserAgent(const char* user_agent) override;
    ImagesList* GetImagesList(unsigned flags) override;
    void BeginCaptureFrames(FrameCaptureCallback callback, void* user_data) override;
    void EndCaptureFrames() override;
    void CaptureNextFrame(FrameCaptureCallback callback, void* user_data) override;
    void GetCacheCountStats(CacheType type, unsigned* current, unsigned* capacity) override;
    void GetCacheBytesStats(CacheType type, size_t* current, size_t* capacity) override;
    void SetCacheCountSize(CacheType type, unsigned count) override;
    void SetCacheBytesSize(CacheType type, unsigned bytes) override;
    void ClearCaches(uint32_t mask) override;
    IEventHandler* RegisterForEvent(const char* name, IEventHandler* handler) override;
    void UnregisterFromEvent(IEventHandler* handler) override;
    IEventHandler* BindCall(const char* name, IEventHandler* handler) override;
    void UnbindCall(const char* name) override;
    void UnregisterAll(void* owner) override;
    bool IsReadyForBindings() const override;
    void ExecuteScript(const char* source) override;
    void AddInitialScript(const char* source) override;
    void ClearInitialScripts() override;
    void SetCustomCompositor(fresco::ICustomCompositor* compositor) override;
    void SetCustomEffectRenderer(fresco::ICustomEffectRenderer* renderer) override;
    Binder* GetBinder() override;
    void SynchronizeModels() override;
    void RegisterTypeBinding(const char* type_name, void (*binding)(Binder*, void*)) override;
    void UpdateWholeModel(void* model, const char* type_name) override;
    void UnregisterModel(void* model, const char* type_name) override;
    void CreateModel(const char* name, void* model, const char* type_name,
                     void (*writer)(Binder*, void*)) override;
    void RaiseBoundEvent(const char* name) override;

    // --- dom::IDocumentHost
    StringPool& GetStringPool() override { return *services_.strings; }
    TaskFamilyHandle GetTaskFamily() override { return family_; }
    uint32_t GetViewId() const override { return id_; }
    dom::HostSize GetViewSize() const override { return {width_, height_}; }
    bool HasOtherLoadsPending() const override { return load_pending_; }
    bool AreComplexSelectorsEnabled() const override { return complex_selectors_; }
    layout::FontManager* GetFontManager() override { return services_.fonts; }
    layout::IFontResolver* GetFontResolver() override;
    ILocalizationManager* GetLocalizationManager() override { return services_.localization; }
    ITextTransformationManager* GetTextTransformationManager() override {
        return services_.text_transformation;
    }
    IInternationalizationManager* GetInternationalizationManager() override {
        return services_.internationalization;
    }
    dsp::DirtyRegion* GetDirtyRegion() override { return &dirty_region_; }
    dom::IImageLoader* GetImageLoader() override;
    dom::ISVGLoader* GetSVGLoader() override;
    void RequestFrames(uint32_t count) override;
    void OnDOMBuilt(dom::Document& document) override;
    void OnFinishLoad(dom::Document& document) override;
    void EvaluateScript(dom::Document& document, std::string_view source,
                        std::string_view source_url) override;
    void NavigateTo(const URL& url) override;

    // --- ILoaderHost
    TaskFamilyHandle GetLoaderFamily() override { return family_; }
    bool IsRequestAllowed(const URL& url) override;
    bool GiveUpRequest(uint32_t id, const dom::Document& document) override;

    // --- dom::IWindowHost
    // The value of the time callback, or the time of the last Advance.
    double GetTime() const override;
    const char* GetUserAgent() const override { return user_agent_.c_str(); }
    bool OnConsoleLine(Logging::Severity severity, std::string_view line) override;

    // --- ITimerClock
    double GetTimerTime() const override { return GetTime(); }

    // --- For the renderers of this view. Render thread.
    RenderLink& GetRenderLink() { return *link_; }
    FrameStatsRecorder& GetFrameStats() { return stats_; }
    // An operation of this view, or its end, is on the stack. Main thread.
    bool IsInsideOperation() const { return api_depth_ != 0; }
    // The frame that is on the layout side ends; when the workers have been stopped, it is dropped.
    void WaitUntilLayoutIdle();

    // --- For the debug interfaces and the script globals. Main thread.
    dom::Document* GetDocument() const { return document_.get(); }
    const ViewServices& GetServices() const { return services_; }
    TimerQueue& GetTimers() { return timers_; }
    std::mt19937_64& GetRandom() { return random_; }
    // The last Advance gave the layout side something to do.
    bool HasPushedFrame() const { return pushed_frame_; }
    void SetFlexAlgorithm(layout::FlexAlgorithm algorithm);

  private:
    void MarkWholeViewDirty();

    // --- view_frame.cpp, in the order of a frame
    void OpenFrameId();
    void HandleRendererReset();
    void TakeTime(double time);
    void RunMainThreadResults();
    void ExecuteTimersAndScripts();
    void PumpScriptEngine();
    void AdvanceDocument();
    layout::LayoutWork SolveFrame();
    TaskPtr MakePreloadTask();
    void WaitForPendingFrame();
    void CommitFrame(layout::LayoutWork work);
    void ApplyViewSideCacheRequests();
    void NoteCacheUse();
    void QueueCacheOperations();
    FrameDataPtr MakeFrameData();
    TaskPtr MakeScheduledTask();
    void PushFrame(layout::LayoutWork work, TaskPtr preload);
    void CompleteIdleFrame();
    void CloseFrame();
    // The frame object of the open frame id, made on first need.
    RenderFrame& GetOpenFrame();
    bool ShouldRecord() const;

    // --- view_loading.cpp
    void NavigateToURL(std::string_view text);
    void RequestDocument(const URL& url);
    void OnHTMLContent(const URL& url, RefPtr<dom::ParsedHTML> html);
    void FailLoad(const URL& url, const char* error);
    void CreateDocument(const URL& url);
    void CreateScriptContext();
    void RunInitialScripts();
    void UnloadDocumentNow();
    void DropFrameOnLayoutSide();

    // Reports whether the page may be talked to through the binder.
    bool RequireBinder() const;
    bool RequireDocument() const;

    ViewServices services_;
    // Shared with the renderers; the names below stand for its parts.
    RefPtr<RenderLink> link_;
    FrameQueue& frame_queue_;
    FrameStatsRecorder& stats_;
    fresco::IScene* const scene_;
    TaskFamilyHandle family_;
    uint32_t id_;

    // Settings
    IViewListener* listener_;
    ITextInputHandler* text_input_handler_;
    OnFrameCompleteCallback on_frame_complete_;
    GetCurrentTimeCallback get_current_time_;
    void* callback_user_data_;
    uint32_t width_;
    uint32_t height_;
    uint32_t double_click_interval_;
    float gesture_scroll_threshold_;
    bool complex_selectors_;
    bool intercept_all_requests_;
    bool asynchronous_layout_;
    bool wait_for_renderer_;
    bool disable_flex_basis_units_;

    // Page
    URL url_;
    String user_agent_;
    Vector<String, MemoryTag::General> initial_scripts_;
    script::ScriptingContextPtr script_context_;
    RefPtr<dom::Document> document_;
    TimerQueue timers_;
    std::mt19937_64 random_;
    // Counts loads: an answer to an older one finds its number outdated.
    uint32_t load_number_ = 0;
    bool load_pending_ = false;

    // Public operations of this view on the stack.
    uint32_t api_depth_ = 0;
    bool destroying_ = false;

    // Frame
    double time_ = 0;
    double previous_time_ = 0;
    /// Since the script engine's own timers last had their turn.
    uint32_t loading_frames_ = 0;
    std::atomic<uint32_t> layout_unblocked_{1};
    uint32_t frame_id_ = 0;
    uint32_t open_frame_id_ = 0;
    bool frame_open_ = false;
    bool advancing_ = false;
    bool pushed_frame_ = false;
    bool force_full_layout_ = false;
    uint32_t requested_frames_ = 0;
    RenderFramePtr open_frame_;
    dsp::DirtyRegion dirty_region_;
    layout::LayoutUpdatePtr update_;
    layout::FlexAlgorithm flex_algorithm_ = layout::FlexAlgorithm::Yoga;

    // Rendering
    uint32_t last_rendering_generation_ = 0;
    // Layout thread between commit and the frame's end, main thread while the layout side is idle.
    dsp::RenderCaches render_caches_;
    CacheRequests cache_requests_;
    unsigned shadow_capacity_request_ = 0;  // 0: none
    unsigned path_capacity_request_ = 0;
    // In the order of the table in view_caches.cpp.
    std::array<unsigned, 5> cache_counts_{32, 64, 0, 0, 0};
    std::array<size_t, 5> cache_bytes_{};
    std::array<unsigned, 2> cache_use_{};
    float scale_x_ = 1;
    float scale_y_ = 1;
    bool rendering_enabled_ = true;
    // Changes went unrecorded or unpainted: the next frame that is recorded shows everything.
    bool picture_lost_ = false;
    bool continuous_repaint_ = false;
    bool show_paint_rectangles_ = false;
    bool paint_option_ = false;
    bool gpu_metadata_ = false;

    // Capture
    FrameCaptureCallback capture_callback_ = nullptr;
    void* capture_user_data_ = nullptr;
    bool capture_all_ = false;
};

}  // namespace qorvex
