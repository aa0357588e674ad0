#pragma once

#include <qorvex/qorvex.h>

#include <atomic>
#include <cstdint>
#include <memory>
#include <mutex>
#include <string>
#include <vector>

#include "host/counting_allocator.h"
#include "host/software_render_target.h"
#include "host/unruly_resource_handler.h"
#include "random.h"
#include "site.h"
#include "workers.h"

namespace stress {

class World;

// Keeps the last lines, and what no operation here may lead to.
class Witness final : public qorvex::Logging::ILogHandler {
  public:
    explicit Witness(bool print) : print_(print) {}
    void WriteLog(qorvex::Logging::Severity severity, const char* text, unsigned length) override;
    void Fault(const std::string& line);
    [[nodiscard]] std::vector<std::string> Faults() const;

  private:
    const bool print_;
    mutable std::mutex mutex_;
    std::vector<std::string> faults_;
};

// Records stay until the end of the sequence, since callbacks may come as long as the library lives.
struct SystemSlot {
    qorvex::System* system = nullptr;
    std::unique_ptr<qorvex::host::UnrulyResourceHandler> handler;
};

struct ViewSlot final : qorvex::IViewListener {
    ViewSlot(World& owner, SystemSlot& parent) : world(owner), system(parent) {}

    bool OnNavigateTo(const char* url) override;
    qorvex::InterceptRequestStatus OnResourceRequestIntercepted(const char* url) override;
    void OnScriptContextCreated() override;
    void OnDOMBuilt() override;
    void OnLoadFailed(const char* url, const char* error) override;
    void OnFinishLoad(const char* url) override;
    // Any thread.
    static void OnFrameComplete(void* slot, std::uint32_t view, std::uint32_t frame, std::uint32_t);

    World& world;
    SystemSlot& system;
    qorvex::View* view = nullptr;
    double time = 0;                       // of its last good Advance, milliseconds
    int depth = 0;                         // operations of this view on the stack
    std::atomic<std::uint32_t> frames{0};  // completed; also the next id
};

struct RendererSlot {
    qorvex::ViewRenderer* renderer = nullptr;
    qorvex::SystemRenderer* parent = nullptr;
    ViewSlot* view = nullptr;
    qorvex::host::SoftwareRenderTarget target{64, 48};
};

// One library from its start to its end, with the systems, views and renderers of one sequence. Everything
// that is random comes from the seed; with Mode::Sync and Mode::Polling the run is the same run each time.
class World {
  public:
    World(Mode mode, std::uint64_t seed, bool print);
    ~World();

    // So many random operations, then the end in some order.
    void Run(unsigned operations);
    // What went wrong; empty when nothing did.
    [[nodiscard]] std::vector<std::string> Faults() const { return witness_.Faults(); }

    // --- For the operations
    Random& Rng() { return random_; }
    [[nodiscard]] Mode GetMode() const { return mode_; }
    [[nodiscard]] qorvex::Library& Library() { return *library_; }
    RenderThread& Render() { return render_; }
    Witness& Log() { return witness_; }
    [[nodiscard]] bool IsStopped() const { return stopped_; }

    // Null when there is none that lives.
    SystemSlot* AnySystem();
    ViewSlot* AnyView();
    RendererSlot* AnyRenderer();

    void CreateSystem();
    void CreateView();
    void CreateRenderer();
    void DestroySystem(SystemSlot& slot);
    void DestroyView(ViewSlot& slot);
    void DestroyRenderer(RendererSlot& slot);
    void StopWorkers();
    void ServeWork();
    // Calls an operation of the view. The view may be gone afterwards.
    template <class Body>
    void Call(ViewSlot& slot, Body body) {
        ++slot.depth;
        body(*slot.view);
        --slot.depth;
    }
    // From inside a listener: now and then the game does something there.
    void React(ViewSlot& slot);

  private:
    void StepHandlers();
    void End();
    void DestroyInSomeOrder();
    void DestroyAll(std::size_t kind);
    bool IsBusy(const SystemSlot& slot) const;

    const Mode mode_;
    Random random_;
    Witness witness_;
    qorvex::host::CountingAllocator allocator_;
    Site site_;
    Workers workers_;
    RenderThread render_;
    qorvex::Library* library_ = nullptr;
    std::vector<std::unique_ptr<SystemSlot>> systems_;
    std::vector<std::unique_ptr<ViewSlot>> views_;
    std::vector<std::unique_ptr<RendererSlot>> renderers_;
    std::vector<qorvex::SystemRenderer*> system_renderers_;
    int reactions_ = 0;  // on the stack
    bool stopped_ = false;
};

// One random operation; its name, a literal.
const char* DoSomething(World& world);
// One that a game may try inside a listener of the view.
void DoSomethingInside(World& world, ViewSlot& slot);

}  // namespace stress
