#pragma once

#include <qorvex/frame_stats.h>
#include <qorvex/view_listener.h>

#include <atomic>
#include <chrono>
#include <cstdint>
#include <memory>
#include <string>
#include <vector>

#include "host/counting_allocator.h"
#include "host/file_system.h"
#include "host/folder_resource_handler.h"
#include "host/icu_text_services.h"
#include "host/json_localization.h"
#include "host/manual_clock.h"
#include "host/print_log_handler.h"
#include "host/software_render_target.h"
#include "host/unruly_resource_handler.h"
#include "host/worker_pool.h"
#include "options.h"

namespace qorvex {
class IDebugInterface;
class Library;
class System;
class SystemRenderer;
class View;
class ViewRenderer;
}  // namespace qorvex

namespace player {

// The engine with one view, as both the headless and the windowed run use it. One thread plays the main and
// the render role; layout and resource work run on the worker pool.
class Session final : public qorvex::IViewListener {
  public:
    // Null on failure, with one line for the user in `error`.
    [[nodiscard]] static std::unique_ptr<Session> Create(const Options& options, bool headless,
                                                         std::string& error);
    ~Session() override;

    // Asks for the page of the options. False with a line when it is no readable page.
    [[nodiscard]] bool LoadPage(std::string& error);

    // Blocks until every resource answer and all announced work is done, so that the next Advance depends on
    // its time alone.
    void Settle();
    // One frame: System and View advance to `time`, then the frame is painted into the target. Returns the
    // frame's id.
    std::uint32_t RunFrame(double time);

    void Resize(std::uint32_t width, std::uint32_t height);

    [[nodiscard]] qorvex::View* View() { return view_; }
    [[nodiscard]] qorvex::IDebugInterface* Debug() { return debug_; }
    [[nodiscard]] qorvex::IFrameStats* Stats() { return stats_; }
    [[nodiscard]] qorvex::host::SoftwareRenderTarget& Target() { return target_; }
    [[nodiscard]] bool IsLoaded() const;
    // What OnLoadFailed said; empty while nothing failed.
    [[nodiscard]] const std::string& LoadError() const { return load_error_; }
    // True while answers are held back on purpose (--unruly).
    [[nodiscard]] bool HoldsAnswersBack() const;
    // True when an Error or Assert line was logged.
    [[nodiscard]] bool SawErrors() const;

  private:
    Session(const Options& options, bool headless);
    bool Start(std::string& error);
    bool AddBitmapFonts(std::string& error);
    void SetTarget();
    void OnLoadFailed(const char* url, const char* error) override;
    static void OnFrameComplete(void* session, std::uint32_t view, std::uint32_t frame, std::uint32_t);
    static double CurrentTime(void* session, std::uint32_t view);

    const Options options_;
    const bool real_clock_;
    std::string page_url_;
    std::string engine_options_;
    std::string load_error_;
    qorvex::host::ManualClock clock_;
    std::chrono::steady_clock::time_point start_ = std::chrono::steady_clock::now();
    std::atomic<std::uint32_t> completed_frame_{0};

    qorvex::host::CountingAllocator allocator_;
    qorvex::host::PrintLogHandler log_;
    qorvex::host::FileSystem files_;
    qorvex::host::IcuInternationalization internationalization_;
    qorvex::host::IcuTextTransformation text_transformation_;
    qorvex::host::JsonLocalization localization_;
    std::unique_ptr<qorvex::host::FolderResourceHandler> resources_;
    std::unique_ptr<qorvex::host::UnrulyResourceHandler> unruly_;
    qorvex::host::WorkerPool pool_;
    qorvex::host::SoftwareRenderTarget target_;

    qorvex::Library* library_ = nullptr;
    qorvex::System* system_ = nullptr;
    qorvex::View* view_ = nullptr;
    qorvex::SystemRenderer* system_renderer_ = nullptr;
    qorvex::ViewRenderer* view_renderer_ = nullptr;
    qorvex::IDebugInterface* debug_ = nullptr;
    qorvex::IFrameStats* stats_ = nullptr;
};

}  // namespace player
