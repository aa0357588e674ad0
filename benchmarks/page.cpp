#include "benchmarks/page.h"

#include <cstring>

namespace bench {

using namespace qorvex;

namespace {

std::string Markup(int elements) {
    std::string page =
        "<style>body{display:flex;flex-wrap:wrap}.b{width:4px;height:4px;background-color:#123456}</style>"
        "<body>";
    for (int i = 0; i < elements; ++i)
        page += "<div class=b></div>";
    return page;
}

}  // namespace

void Page::Handler::OnResourceRequest(const IAsyncResourceRequest*, IAsyncResourceResponse* response) {
    std::memcpy(response->GetSpace(page_.size()), page_.data(), page_.size());
    response->SetStatus(200);
    response->Finish(IAsyncResourceResponse::Status::Success);
}

Page::Page(const PageSettings& settings)
    : handler_(settings.markup.empty() ? Markup(settings.elements) : settings.markup),
      target_(settings.width, settings.height),
      elements_(settings.markup.empty() ? settings.elements : 0),
      layout_elsewhere_(settings.layout_elsewhere) {
    Start(settings);
    view_->LoadURL("bench://page.html");
    constexpr int kMostFrames = 1000;
    constexpr int kSettlingFrames = 8;
    for (int i = 0; i < kMostFrames && !listener_.loaded; ++i)
        Frame();
    for (int i = 0; i < kSettlingFrames; ++i)
        Frame();
}

void Page::Start(const PageSettings& settings) {
    LibraryParams params;
    params.Allocator = &allocator_;
    params.LogHandler = &log_;
    params.LoggingSeverity = Logging::Error;
    library_ = Library::Initialize(params);
    SystemSettings system_settings;
    system_settings.ResourceHandler = &handler_;
    system_settings.EmbeddedFallbackFont = 2;
    system_ = library_->CreateSystem(system_settings);
    ViewSettings view_settings;
    view_settings.Width = settings.width;
    view_settings.Height = settings.height;
    view_settings.Listener = &listener_;
    view_settings.ExecuteLayoutOnDedicatedThread = settings.layout_elsewhere;
    view_settings.OnFrameComplete = [](void* page, std::uint32_t, std::uint32_t id, std::uint32_t) {
        static_cast<Page*>(page)->frame_ = id;
    };
    view_settings.CallbackUserData = this;
    view_ = system_->CreateView(view_settings);
    system_renderer_ = system_->CreateSystemRenderer({});
    renderer_ = system_renderer_->CreateViewRenderer(view_);
    renderer_->SetRenderTargetSimple(target_.Color(), nullptr, settings.width, settings.height, 1);
}

Page::~Page() {
    if (layout_elsewhere_) LayOut();
    renderer_->Destroy();
    system_renderer_->Destroy();
    view_->Destroy();
    system_->Destroy();
    library_->StopWorkers();
    library_->Uninitialize(false);
    // Uninitialize clears the pointer that the other benchmarks rely on.
    SetAllocator(before_);
}

bool Page::IsComplete() {
    if (elements_ == 0) return listener_.loaded && log_.errors == 0;
    const std::string check =
        "if (document.getElementsByTagName('div').length !== " + std::to_string(elements_) +
        ") throw 'short'";
    view_->ExecuteScript(check.c_str());
    return listener_.loaded && log_.errors == 0;
}

void Page::Frame() {
    library_->ExecuteWork(WorkType::Resources, WorkExecutionMode::RunUntilEmpty, kAllTaskFamilies);
    // Pages arrive on the system's channel.
    system_->Advance(time_);
    Advance();
    if (layout_elsewhere_) LayOut();
    renderer_->Paint(frame_, false);
}

}  // namespace bench
