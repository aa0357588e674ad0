// The life of a system, its views and its share of a frame.
#include "core/system_impl.h"

#include <qorvex/renderers.h>

#include <fresco/library.h>

#include <algorithm>

#include "core/api_call.h"
#include "core/library_impl.h"
#include "core/logging/log.h"
#include "core/memory/thread_scope.h"
#include "core/render/system_renderer_impl.h"
#include "core/unavailable.h"
#include "core/view_impl.h"

namespace qorvex {

namespace {

constexpr unsigned kSystemIds = 16;
constexpr uint32_t kLastPort = 65535;
constexpr TaskChannels kSystemChannels[] = {TaskChannels::Main, TaskChannels::Resources};

unsigned g_next_system_id = 0;  // main thread

void LogChannel(const char* what, TaskChannels channel, uint32_t family) {
    LogTrace(what, static_cast<uint32_t>(channel), " on family ", family);
}

}  // namespace

SystemImpl::SystemImpl(LibraryImpl& library, const SystemSettings& settings, uint32_t family)
    : library_(library),
      family_{family, &library.GetTasks()},
      default_rules_(MakeRef<css::DefaultRules>(strings_)),
      resources_(MakeRef<ResourceContext>(settings.ResourceHandler, library.GetResponses(),
                                          settings.ResourceRequestsOnWorkers)),
      html_cache_(family_, *resources_),
      stylesheet_cache_(family_, *resources_, strings_),
      images_(MakeRef<CachedImagesManager>(family_, resources_, library.GetRendering(),
                                           settings.ImageCacheLimits)),
      svgs_(MakeRef<CachedSVGManager>(family_, resources_, settings.SVGCacheLimits)),
      font_loader_(*resources_),
      localization_(settings.LocalizationManager),
      text_transformation_(settings.TextTransformationManager),
      internationalization_(settings.InternationalizationManager) {
    CheckParts(settings);
    SetId(g_next_system_id++);
    StartInspector(settings);
    for (uint32_t i = 0; i < settings.ResourceMappingCount; ++i)
        resources_->GetMappings().Add(settings.ResourceMappings[i]);
    CreateFontManager(settings);
    strings_.KeepSoFar();
    for (TaskChannels channel : kSystemChannels) {
        LogChannel("Opening task channel ", channel, family_.family);
        family_.system->OpenChannel(channel, family_.family);
    }
    LogDebug("Text transform manager ", text_transformation_ ? "enabled" : "disabled");
}

SystemImpl::~SystemImpl() = default;

void SystemImpl::CheckParts(const SystemSettings& settings) const {
    if (!settings.ResourceHandler)
        AssertFailure("No resource handler set on System! Resource loading will fail!");
    if (!family_.system) AssertFailure("System cannot operate without a task system!");
}

void SystemImpl::StartInspector(const SystemSettings& settings) {
    if (!settings.EnableInspector)
        LogDebug("Inspector is disabled");
    else if (settings.InspectorPort == 0 || settings.InspectorPort > kLastPort)
        LogDebug("Inspector port is not valid, remote debugging disabled.");
    else
        LogUnavailable("System::EnableInspector");
}

void SystemImpl::CreateFontManager(const SystemSettings& settings) {
    fresco::IFontService* service = library_.GetRendering().GetFontService();
    if (!service) return;
    layout::FontManagerSettings fonts{*service,
                                      TaskFamilyHandle{library_.TakeFamily(), family_.system},
                                      font_loader_,
                                      font_names_,
                                      {settings.DefaultFontFamily, library_.GetDefaultFontFamily()},
                                      settings.EmbeddedFallbackFont};
    fonts_ = MakeUnique<layout::FontManager>(fonts);
}

unsigned SystemImpl::GetId() const {
    const MainThreadCall call("System");
    return call ? id_ : 0;
}

void SystemImpl::SetId(unsigned id) {
    const MainThreadCall call("System");
    if (!call) return;
    id_ = id < kSystemIds ? id : 0;
}

View* SystemImpl::CreateView(const ViewSettings& settings) {
    const MainThreadCall call("System");
    if (!call) return nullptr;
    ViewServices services;
    services.tasks = &library_.GetTasks();
    services.library_timers = &library_.GetTimers();
    services.strings = &strings_;
    services.resources = resources_.get();
    services.html_cache = &html_cache_;
    services.stylesheet_cache = &stylesheet_cache_;
    services.images = images_.get();
    services.svgs = svgs_.get();
    services.default_rules = default_rules_;
    services.fonts = fonts_.get();
    services.localization = localization_;
    services.text_transformation = text_transformation_;
    services.internationalization = internationalization_;
    services.rendering = &library_.GetRendering();
    services.lifetime_tracker = this;
    services.use_dedicated_layout_thread = library_.UsesDedicatedLayoutThread();
    services.snap_to_pixels = library_.SnapsToPixels();
    services.preload_font_data = library_.PreloadsFontData();
    ViewImpl* view = New<ViewImpl, MemoryTag::General>(settings, services, library_.TakeFamily());
    views_.push_back(view);
    return view;
}

void SystemImpl::OnViewDestroyed(View* view) {
    views_.erase_if([&](ViewImpl* other) { return other == view; });
    ReleaseStrings();
}

// Without views only the cached sheets hold atoms, which have kept theirs, and those that are being parsed.
void SystemImpl::ReleaseStrings() {
    if (views_.empty() && !stylesheet_cache_.IsLoading()) strings_.ReleaseOthers();
}

void SystemImpl::OnWorkersStopped() {
    for (ViewImpl* view : views_)
        view->WaitUntilLayoutIdle();
}

bool SystemImpl::IsInsideOperation() const {
    return destroying_ || std::any_of(views_.begin(), views_.end(),
                                      [](const ViewImpl* view) { return view->IsInsideOperation(); });
}

SystemRenderer* SystemImpl::CreateSystemRenderer(const SystemRendererSettings& settings) {
    ThreadScope scope;
    if (library_.IsRenderingLibraryExternal()) {
        LogError(
            "Cannot use CreateSystemRenderer with external rendering library. Please use "
            "CreateSystemRendererWithExternalRenderingLibrary method instead.");
        return nullptr;
    }
    fresco::Library::EnableDebugNames(settings.EnableDebugNames);
    return New<SystemRendererImpl, MemoryTag::General>(library_.GetRendering(), library_.GetRenderers(),
                                                       settings.EnableDebugNames, false);
}

SystemRenderer* SystemImpl::CreateSystemRendererWithExternalRenderingLibrary() {
    ThreadScope scope;
    if (!library_.IsRenderingLibraryExternal()) {
        LogError(
            "Cannot use CreateSystemRendererWithExternalRenderingLibrary without external rendering library. "
            "Please use CreateSystemRenderer method instead.");
        return nullptr;
    }
    return New<SystemRendererImpl, MemoryTag::General>(library_.GetRendering(), library_.GetRenderers(),
                                                       false, true);
}

void SystemImpl::Advance(double) {
    const MainThreadCall call("System");
    if (!call) return;
    family_.system->Run(TaskChannels::Main, false, nullptr, family_.family);
    if (fonts_) fonts_->RunMainTasks();
}

void SystemImpl::Destroy() {
    const MainThreadCall call("System");
    if (!call) return;
    if (IsInsideOperation()) {
        LogError("System::Destroy must not be called from inside an operation of one of its views");
        return;
    }
    destroying_ = true;
    // Views stand on the system's caches and strings; none may outlive it.
    while (!views_.empty()) {
        LogError("System::Destroy called before its views were destroyed");
        views_[views_.size() - 1]->Destroy();
    }
    // Nobody is left who wants what is on its way. The client is told and not waited for, since it may never
    // answer: a late answer finds a closed family.
    html_cache_.Clear();
    stylesheet_cache_.AbandonLoads();
    images_->Close();
    svgs_->Close();
    for (TaskChannels channel : kSystemChannels) {
        LogChannel("Closing task channel ", channel, family_.family);
        family_.system->CloseChannel(channel, family_.family);
    }
    fonts_.reset();
    library_.OnSystemDestroyed(this);
    Delete<MemoryTag::General>(this);
}

}  // namespace qorvex
