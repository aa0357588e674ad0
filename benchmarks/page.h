// A page that is really loaded, through the public interfaces: settled and painted.
#pragma once

#include <qorvex/qorvex.h>

#include <cstdint>
#include <string>

#include "core/memory/allocator.h"
#include "host/counting_allocator.h"
#include "host/software_render_target.h"

namespace bench {

struct PageSettings {
    int elements = 1;      // boxes
    std::string markup{};  // instead of them, unless empty
    std::uint32_t width = 640;
    std::uint32_t height = 360;
    // Frames are laid out by whoever calls ExecuteWork for the view's family, not inside Advance.
    bool layout_elsewhere = false;
};

class Page {
  public:
    explicit Page(const PageSettings& settings);
    ~Page();
    Page(const Page&) = delete;
    Page& operator=(const Page&) = delete;

    // The load has finished, without an error, and every box is there.
    [[nodiscard]] bool IsComplete();
    // One turn of a game's loop on one thread.
    void Frame();
    void Advance() { view_->Advance(time_ += 16); }
    void Run(const char* script) { view_->ExecuteScript(script); }
    void LayOut() {
        library_->ExecuteWork(qorvex::WorkType::Layout, qorvex::WorkExecutionMode::RunUntilEmpty,
                              view_->GetTaskFamilyId());
    }
    [[nodiscard]] std::uint64_t Allocations() const { return allocator_.Total().allocations; }
    // Of the newest frame that has been recorded.
    [[nodiscard]] std::uint32_t FrameId() const { return frame_; }
    qorvex::View& view() { return *view_; }
    qorvex::ViewRenderer& renderer() { return *renderer_; }

  private:
    // Serves the page from memory.
    class Handler final : public qorvex::IAsyncResourceHandler {
      public:
        explicit Handler(std::string page) : page_(std::move(page)) {}
        void OnResourceRequest(const qorvex::IAsyncResourceRequest* request,
                               qorvex::IAsyncResourceResponse* response) override;

      private:
        std::string page_;
    };
    class Listener final : public qorvex::IViewListener {
      public:
        void OnFinishLoad(const char*) override { loaded = true; }
        bool loaded = false;
    };
    // Keeps count; a page that is not as it should be throws.
    class Log final : public qorvex::Logging::ILogHandler {
      public:
        void WriteLog(qorvex::Logging::Severity, const char*, unsigned) override { ++errors; }
        int errors = 0;
    };

    void Start(const PageSettings& settings);

    qorvex::IAllocator* before_ = qorvex::GetAllocator();
    qorvex::host::CountingAllocator allocator_;
    Log log_;
    Handler handler_;
    Listener listener_;
    qorvex::host::SoftwareRenderTarget target_;
    const int elements_;  // 0: not counted
    const bool layout_elsewhere_;
    std::uint32_t frame_ = 0;
    double time_ = 0;
    qorvex::Library* library_ = nullptr;
    qorvex::System* system_ = nullptr;
    qorvex::View* view_ = nullptr;
    qorvex::SystemRenderer* system_renderer_ = nullptr;
    qorvex::ViewRenderer* renderer_ = nullptr;
};

}  // namespace bench
