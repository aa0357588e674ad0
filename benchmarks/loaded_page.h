// A view with one loaded and settled page, painted in software, for benchmarks of whole pages.
#pragma once

#include <qorvex/qorvex.h>
#include <qorvex/view_listener.h>

#include <cstdlib>
#include <cstring>
#include <string>

#include "core/memory/allocator.h"
#include "host/counting_allocator.h"
#include "host/software_render_target.h"

namespace qorvex::bench {

// Serves one page from memory.
class PageHandler final : public IAsyncResourceHandler {
  public:
    explicit PageHandler(std::string page) : page_(std::move(page)) {}
    void OnResourceRequest(const IAsyncResourceRequest*, IAsyncResourceResponse* response) override {
        std::memcpy(response->GetSpace(page_.size()), page_.data(), page_.size());
        response->SetStatus(200);
        response->Finish(IAsyncResourceResponse::Status::Success);
    }

  private:
    std::string page_;
};

class QuietLog final : public Logging::ILogHandler {};

class LoadedPage final : private IViewListener {
  public:
    explicit LoadedPage(std::string markup) : handler_(std::move(markup)), target_(640, 360) {
        LibraryParams params;
        params.Allocator = &allocator_;
        params.LogHandler = &log_;
        params.LoggingSeverity = 6;
        library_ = Library::Initialize(params);
        SystemSettings system_settings;
        system_settings.ResourceHandler = &handler_;
        system_settings.EmbeddedFallbackFont = 2;
        system_ = library_->CreateSystem(system_settings);
        ViewSettings view_settings;
        view_settings.Listener = this;
        view_settings.Width = 640;
        view_settings.Height = 360;
        view_settings.OnFrameComplete = [](void* page, std::uint32_t, std::uint32_t id, std::uint32_t) {
            static_cast<LoadedPage*>(page)->frame_ = id;
        };
        view_settings.CallbackUserData = this;
        view_ = system_->CreateView(view_settings);
        system_renderer_ = system_->CreateSystemRenderer({});
        renderer_ = system_renderer_->CreateViewRenderer(view_);
        RenderTargetDescription description;
        description.Width = 640;
        description.Height = 360;
        renderer_->SetRenderTarget(target_.Color(), nullptr, &description);
        view_->LoadURL("bench://page.html");
        for (int i = 0; i < 12; ++i)
            Frame();
        if (!loaded_) std::abort();  // an empty view would be measured
    }
    ~LoadedPage() {
        renderer_->Destroy();
        system_renderer_->Destroy();
        view_->Destroy();
        system_->Destroy();
        library_->StopWorkers();
        library_->Uninitialize(false);
        // Uninitialize clears the pointer that the other benchmarks rely on.
        SetAllocator(before_);
    }

    void Frame() {
        library_->ExecuteWork(WorkType::Resources, WorkExecutionMode::RunUntilEmpty, kAllTaskFamilies);
        Advance();
        renderer_->Paint(frame_, false);
    }
    void Advance() {
        system_->Advance(time_ += 16);
        view_->Advance(time_);
    }
    void Run(const char* script) { view_->ExecuteScript(script); }
    [[nodiscard]] View* GetView() const { return view_; }
    [[nodiscard]] std::uint64_t Allocations() const { return allocator_.Total().allocations; }

  private:
    void OnFinishLoad(const char*) override { loaded_ = true; }

    bool loaded_ = false;
    IAllocator* before_ = GetAllocator();
    host::CountingAllocator allocator_;
    QuietLog log_;
    PageHandler handler_;
    host::SoftwareRenderTarget target_;
    std::uint32_t frame_ = 0;
    double time_ = 0;
    Library* library_ = nullptr;
    System* system_ = nullptr;
    View* view_ = nullptr;
    SystemRenderer* system_renderer_ = nullptr;
    ViewRenderer* renderer_ = nullptr;
};

}  // namespace qorvex::bench
