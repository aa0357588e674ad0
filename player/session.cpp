#include "session.h"

#include <qorvex/debug_interface.h>
#include <qorvex/library.h>
#include <qorvex/renderers.h>
#include <qorvex/system.h>
#include <qorvex/view.h>
#include <qorvex/view_settings.h>

#include <algorithm>
#include <cstdio>
#include <filesystem>

#include "bitmap_font.h"

namespace player {
namespace fs = std::filesystem;
using namespace qorvex;

namespace {

// What Debian's fonts-dejavu-core installs, and the family name in these files.
constexpr const char* kDefaultFamily = "DejaVu Sans";
constexpr const char* kDefaultFontFiles[] = {
    "/usr/share/fonts/truetype/dejavu/DejaVuSans.ttf",
    "/usr/share/fonts/truetype/dejavu/DejaVuSans-Bold.ttf",
};
constexpr std::int32_t kLargeFallbackFont = 2;
// Images that the page has stopped showing: cleaned from 64 MB or 256 of them down to half.
constexpr CacheLimits kImageCacheLimits = {256, 64u << 20, 128, 32u << 20};
constexpr std::uint32_t kErrorSeverity = 4;

void PrintConsoleLine(void*, const ConsoleMessage& message) {
    std::printf("%.*s\n", static_cast<int>(message.Length), message.Text);
    std::fflush(stdout);
}

host::WorkerPool::Settings PoolSettings(const Options& options) {
    return {options.workers, !options.synchronous_layout};
}

bool UsesRealClock(const Options& options, bool headless) {
    return options.clock == ClockSource::Real || (options.clock == ClockSource::Default && !headless);
}

// The fonts that the rendering library may open through the file system object.
std::string FontOptions(const std::vector<std::string>& fonts) {
    std::string list;
    const auto add = [&list](const std::string& file) {
        list += list.empty() ? "--system-fonts=" : ":";
        list += file;
    };
    for (const std::string& file : fonts)
        add(file);
    for (const char* file : kDefaultFontFiles) {
        std::error_code fault;
        if (fs::exists(file, fault)) add(file);
    }
    return list;
}

}  // namespace

Session::Session(const Options& options, bool headless)
    : options_(options),
      real_clock_(UsesRealClock(options, headless)),
      pool_(PoolSettings(options)),
      target_(options.width, options.height) {}

std::unique_ptr<Session> Session::Create(const Options& options, bool headless, std::string& error) {
    std::unique_ptr<Session> session(new Session(options, headless));
    return session->Start(error) ? std::move(session) : nullptr;
}

bool Session::Start(std::string& error) {
    std::error_code fault;
    // Pages may read their own folder and what lies below the working directory, whichever holds the page.
    fs::path page = options_.page;
    if (options_.page.rfind("file://", 0) == 0) page = options_.page.substr(7);
    page = fs::absolute(page, fault).lexically_normal();
    page_url_ = options_.page.rfind("file://", 0) == 0 ? options_.page : host::FileURL(page);
    const fs::path working = fs::current_path(fault);
    const bool below_working = page.string().rfind(working.string() + "/", 0) == 0;
    resources_ = std::make_unique<host::FolderResourceHandler>(
        below_working ? working : page.parent_path(),
        [](const std::string& line) { std::fprintf(stderr, "resources: %s\n", line.c_str()); });
    if (std::FILE* file = fs::is_regular_file(page, fault) ? std::fopen(page.c_str(), "rb") : nullptr) {
        std::fclose(file);
    } else {
        error = "cannot read " + options_.page;
        return false;
    }

    if (options_.unruly_seed) {
        unruly_ = std::make_unique<host::UnrulyResourceHandler>(*resources_, *options_.unruly_seed);
        // Without the page itself there would be nothing to look at.
        unruly_->Spare(page_url_);
    }

    if (!options_.translations_file.empty() && !localization_.AddFile(options_.translations_file, error))
        return false;
    engine_options_ = FontOptions(options_.fonts);
    if (!options_.stats_file.empty()) engine_options_ = engine_options_ + ' ' + kCountAllocationsOption;
    LibraryParams params;
    params.Allocator = &allocator_;
    params.LoggingSeverity = options_.log_severity;
    params.LogHandler = &log_;
    params.FileSystemReader = &files_;
    params.UseDedicatedLayoutThread = !options_.synchronous_layout;
    params.OnWorkAvailable = host::WorkerPool::OnWorkAvailable;
    params.OnWorkAvailableUserData = &pool_;
    params.DefaultFontFamily = options_.default_font.empty() ? kDefaultFamily : options_.default_font.c_str();
    params.AdditionalOptions = engine_options_.c_str();
    library_ = Library::Initialize(params);
    if (!library_) {
        error = "the engine did not start";
        return false;
    }
    pool_.Start(library_);
    debug_ = static_cast<IDebugInterface*>(library_->GetFeatureInterface(kDebugFeature));
    stats_ = static_cast<IFrameStats*>(library_->GetFeatureInterface(kFrameStatsFeature));
    debug_->SetConsoleCallback(PrintConsoleLine, nullptr);

    SystemSettings system_settings;
    system_settings.ResourceHandler = resources_.get();
    if (unruly_) system_settings.ResourceHandler = unruly_.get();
    system_settings.EmbeddedFallbackFont = kLargeFallbackFont;
    system_settings.ImageCacheLimits = kImageCacheLimits;
    if (options_.text_services) {
        system_settings.InternationalizationManager = &internationalization_;
        system_settings.TextTransformationManager = &text_transformation_;
        system_settings.LocalizationManager = &localization_;
    }
    system_ = library_->CreateSystem(system_settings);
    if (!AddBitmapFonts(error)) return false;

    ViewSettings view_settings;
    view_settings.Listener = this;
    view_settings.Width = options_.width;
    view_settings.Height = options_.height;
    view_settings.OnFrameComplete = OnFrameComplete;
    view_settings.GetCurrentTime = CurrentTime;
    view_settings.CallbackUserData = this;
    view_settings.EnableComplexCSSSelectorsStyling = true;
    view_settings.ExecuteLayoutOnDedicatedThread = !options_.synchronous_layout;
    view_ = system_->CreateView(view_settings);

    system_renderer_ = system_->CreateSystemRenderer(SystemRendererSettings());
    system_renderer_->RegisterRenderThread(nullptr, nullptr, 0);
    view_renderer_ = system_renderer_->CreateViewRenderer(view_);
    SetTarget();
    stats_->SetEnabled(view_, true);
    return true;
}

bool Session::AddBitmapFonts(std::string& error) {
    for (const std::string& path : options_.bitmap_fonts) {
        BitmapFont font;
        if (!font.Load(path, error)) return false;
        std::vector<const void*> pages;
        std::vector<std::uint32_t> sizes;
        for (const std::string& page : font.pages) {
            pages.push_back(page.data());
            sizes.push_back(static_cast<std::uint32_t>(page.size()));
        }
        UserFontDescription description;
        description.FamilyName = font.family.c_str();
        description.Description = font.table.data();
        description.DescriptionSize = static_cast<std::uint32_t>(font.table.size());
        system_->AddUserFontFromEncodedImages(pages.data(), sizes.data(), static_cast<unsigned>(pages.size()),
                                              description);
    }
    return true;
}

Session::~Session() {
    if (view_renderer_) view_renderer_->Destroy();
    if (system_renderer_) system_renderer_->Destroy();
    if (view_) view_->Destroy();
    if (system_) system_->Destroy();
    if (library_) {
        library_->StopWorkers();
        pool_.Stop();
        library_->Uninitialize(false);
    }
}

bool Session::LoadPage(std::string& error) {
    view_->LoadURL(page_url_.c_str());
    if (!load_error_.empty()) error = load_error_;
    return load_error_.empty();
}

void Session::Settle() {
    // The resource handler answers inside the request, or between two frames, so what is left is work on the
    // pool.
    pool_.RunResources();
    pool_.WaitUntilIdle();
}

std::uint32_t Session::RunFrame(double time) {
    clock_.Set(time);
    system_->Advance(time);
    view_->Advance(time);
    // The frame's id is known when its layout side is done.
    pool_.WaitUntilIdle();
    const std::uint32_t frame = completed_frame_.load(std::memory_order_acquire);
    view_renderer_->Paint(frame, true);
    if (unruly_) unruly_->Step();
    return frame;
}

void Session::Resize(std::uint32_t width, std::uint32_t height) {
    target_.Resize(width, height);
    SetTarget();
    view_->Resize(width, height);
}

void Session::SetTarget() {
    RenderTargetDescription description;
    description.Width = target_.Width();
    description.Height = target_.Height();
    view_renderer_->SetRenderTarget(target_.Color(), nullptr, &description);
}

bool Session::IsLoaded() const {
    return debug_->IsLoaded(view_);
}

bool Session::HoldsAnswersBack() const {
    return unruly_ && unruly_->Waiting() > 0;
}

bool Session::SawErrors() const {
    return log_.CountFrom(kErrorSeverity) > 0;
}

void Session::OnLoadFailed(const char* url, const char* error) {
    load_error_ = std::string(error) + ": " + url;
}

void Session::OnFrameComplete(void* session, std::uint32_t, std::uint32_t frame, std::uint32_t) {
    static_cast<Session*>(session)->completed_frame_.store(frame, std::memory_order_release);
}

double Session::CurrentTime(void* session, std::uint32_t) {
    const auto* self = static_cast<Session*>(session);
    if (!self->real_clock_) return self->clock_.Now();
    return std::chrono::duration<double, std::milli>(std::chrono::steady_clock::now() - self->start_).count();
}

}  // namespace player
