// A client of the shared library that brings a rendering library of its own: what it needs from the engine it
// finds in headers and entry points.
#include <fresco/rendering_library.h>
#include <gtest/gtest.h>
#include <qorvex/qorvex.h>

#include <cstring>

#include "host/counting_allocator.h"

namespace {

using namespace qorvex;

class Log final : public Logging::ILogHandler {
  public:
    void WriteLog(Logging::Severity severity, const char* text, unsigned) override {
        if (severity >= Logging::Error) errors += std::string(text) + "\n";
    }
    std::string errors;
};

class OnePage final : public IAsyncResourceHandler {
  public:
    void OnResourceRequest(const IAsyncResourceRequest*, IAsyncResourceResponse* response) override {
        constexpr char page[] =
            "<body style='color:#fff'>text<div style='width:9px;height:9px;"
            "background-color:#123456;opacity:.5'></div>";
        std::memcpy(response->GetSpace(sizeof(page) - 1), page, sizeof(page) - 1);
        response->SetStatus(200);
        response->Finish(IAsyncResourceResponse::Status::Success);
    }
};

// Draws nothing, but lets its owner look at what arrives; the null back end does the rest.
class ClientLibrary final : public fresco::IRenderingLibrary {
  public:
    explicit ClientLibrary(fresco::IRenderingLibrary& inner) : inner_(inner) {}
    void RegisterRenderThread(void*, void*, uint64_t) override {}
    void FreeRenderingResources() override {}
    const char* GetBuildIdentifier() const override { return identifier; }
    void SetFileManipulator(fresco::IFileManipulator* files) override { inner_.SetFileManipulator(files); }
    fresco::IFontService* GetFontService() override { return inner_.GetFontService(); }
    fresco::IScene* CreateScene(const fresco::SceneParams& params) override {
        return scene = inner_.CreateScene(params);
    }
    void SetPaintHelpers(fresco::IPaintHelpers* helpers) override { inner_.SetPaintHelpers(helpers); }
    void RetireImages(const fresco::ImageId* ids, uint32_t count) override {
        inner_.RetireImages(ids, count);
    }
    void Forward(uint64_t first, uint64_t second, uint64_t third) override {
        forwarded = first * 100 + second * 10 + third;
    }
    void Destroy() override {}

    const char* identifier = fresco::kBuildIdentifier.text;
    fresco::IScene* scene = nullptr;
    uint64_t forwarded = 0;

  private:
    fresco::IRenderingLibrary& inner_;
};

class ExternalRenderingTest : public testing::Test {
  protected:
    ExternalRenderingTest() {
        AdaptRenderingAllocatorAndLoggerFromQorvex(&allocator_, &log_, &fresco_allocator_, &fresco_log_);
        fresco::RenderingLibraryParams rendering;
        rendering.allocator = fresco_allocator_;
        rendering.logHandler = fresco_log_;
        null_ = fresco::CreateNullRenderingLibrary(rendering);
        params_.Allocator = &allocator_;
        params_.LogHandler = &log_;
    }
    ~ExternalRenderingTest() override {
        null_->Destroy();
        DestroyAdaptedRenderingAllocatorAndLogger(&allocator_, fresco_allocator_, fresco_log_);
        EXPECT_EQ(allocator_.Total().blocks, 0u);
        EXPECT_EQ(allocator_.Mismatches(), 0u);
    }

    host::CountingAllocator allocator_;
    Log log_;
    fresco::IAllocator* fresco_allocator_ = nullptr;
    fresco::Logging::ILogHandler* fresco_log_ = nullptr;
    fresco::IRenderingLibrary* null_ = nullptr;
    LibraryParamsWithExternalRenderingLibrary params_;
};

TEST_F(ExternalRenderingTest, DrawsThroughTheClientsLibrary) {
    ClientLibrary rendering(*null_);
    Library* library = Library::InitializeWithRenderingLibrary(params_, &rendering);
    ASSERT_NE(library, nullptr);
    OnePage resources;
    SystemSettings system_settings;
    system_settings.ResourceHandler = &resources;
    system_settings.EmbeddedFallbackFont = 2;
    System* system = library->CreateSystem(system_settings);
    ViewSettings view_settings;
    view_settings.Width = view_settings.Height = 64;
    View* view = system->CreateView(view_settings);
    SystemRenderer* system_renderer = system->CreateSystemRendererWithExternalRenderingLibrary();
    ViewRenderer* renderer = system_renderer->CreateViewRenderer(view);
    view->LoadURL("test://page.html");
    const uint64_t rendering_before = allocator_.ForTag(MemoryTag::Rendering).allocations;
    uint32_t commands = 0;
    for (unsigned frame = 0; frame < 8; ++frame) {
        library->ExecuteWork(WorkType::Resources, WorkExecutionMode::RunUntilEmpty, kAllTaskFamilies);
        system->Advance(frame);
        view->Advance(frame);
        EXPECT_EQ(renderer->Paint(frame, false), PaintStatus::Complete);
        commands += static_cast<uint32_t>(rendering.scene->GetStats().commands);
    }
    EXPECT_GT(commands, 0u) << "command buffers arrive at the client's scene";
    EXPECT_GT(allocator_.ForTag(MemoryTag::Rendering).allocations, rendering_before)
        << "and come from the client's allocator";
    library->ForwardToRenderingLibrary(1, 2, 3);
    EXPECT_EQ(rendering.forwarded, 123u);
    renderer->Destroy();
    system_renderer->Destroy();
    view->Destroy();
    system->Destroy();
    library->StopWorkers();
    library->Uninitialize(false);
    EXPECT_EQ(log_.errors, "");
}

TEST_F(ExternalRenderingTest, IsRefusedWhenItIsOfAnotherBuild) {
    ClientLibrary rendering(*null_);
    rendering.identifier = "0000000000000000000000000000000000000000000000000000000000000000";
    EXPECT_EQ(Library::InitializeWithRenderingLibrary(params_, &rendering), nullptr);
    EXPECT_EQ(log_.errors, "Invalid Rendering Library version provided!\n");
}

}  // namespace
