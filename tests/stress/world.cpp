#include "world.h"

#include <algorithm>
#include <cstdio>
#include <string_view>

namespace stress {

using namespace qorvex;

namespace {

constexpr std::size_t kMostSystems = 3;
constexpr std::size_t kMostViews = 5;
constexpr std::size_t kMostRenderers = 6;

// Assertions that operations here ask for.
constexpr std::string_view kExpected[] = {
    "Unable to set virtual resolution",
    "Can't use data-bind API when document is not yet created!",
    "View binding is not initialized yet",
    "Rendering resolution cannot be near-zero!",
};

template <class List, class Lives>
auto* PickLiving(List& list, Random& random, Lives lives) {
    std::vector<typename List::value_type::element_type*> living;
    for (const auto& entry : list)
        if (lives(*entry)) living.push_back(entry.get());
    return living.empty() ? nullptr : random.Pick(living);
}

template <class List, class Lives>
std::size_t CountLiving(const List& list, Lives lives) {
    return static_cast<std::size_t>(
        std::count_if(list.begin(), list.end(), [&](const auto& entry) { return lives(*entry); }));
}

bool SystemLives(const SystemSlot& slot) {
    return slot.system;
}
bool ViewLives(const ViewSlot& slot) {
    return slot.view;
}
bool RendererLives(const RendererSlot& slot) {
    return slot.renderer;
}

}  // namespace

void Witness::WriteLog(Logging::Severity severity, const char* text, unsigned length) {
    const std::string line(text, length ? length - 1 : 0);
    if (print_) std::fprintf(stderr, "    %u %s\n", static_cast<unsigned>(severity), line.c_str());
    if (severity < Logging::Assert) return;
    for (const std::string_view expected : kExpected)
        if (line.find(expected) != std::string::npos) return;
    Fault(line);
}

void Witness::Fault(const std::string& line) {
    const std::lock_guard lock(mutex_);
    faults_.push_back(line);
}

std::vector<std::string> Witness::Faults() const {
    const std::lock_guard lock(mutex_);
    return faults_;
}

bool ViewSlot::OnNavigateTo(const char*) {
    world.React(*this);
    return !world.Rng().Chance(5);
}

InterceptRequestStatus ViewSlot::OnResourceRequestIntercepted(const char*) {
    return world.Rng().Chance(10) ? InterceptRequestStatus::Refuse : InterceptRequestStatus::Allow;
}

void ViewSlot::OnScriptContextCreated() {
    world.React(*this);
}

void ViewSlot::OnDOMBuilt() {
    world.React(*this);
}

void ViewSlot::OnLoadFailed(const char*, const char*) {
    world.React(*this);
}

void ViewSlot::OnFinishLoad(const char*) {
    world.React(*this);
}

void ViewSlot::OnFrameComplete(void* user, std::uint32_t, std::uint32_t frame, std::uint32_t) {
    auto* slot = static_cast<ViewSlot*>(user);
    if (slot->frames.exchange(frame + 1) != frame)
        slot->world.Log().Fault("frame " + std::to_string(frame) + " completes out of order");
}

World::World(Mode mode, std::uint64_t seed, bool print)
    : mode_(mode),
      random_(seed),
      witness_(print),
      workers_(mode),
      render_(mode == Mode::AllThreads || mode == Mode::JobPool) {
    LibraryParams params;
    params.Allocator = &allocator_;
    params.LogHandler = &witness_;
    params.LoggingSeverity = print ? Logging::Trace : Logging::Warning;
    params.UseDedicatedLayoutThread = mode != Mode::Sync;
    params.UseObjectPools = random_.Chance(80);
    params.OnWorkAvailable = &Workers::OnWorkAvailable;
    params.OnWorkAvailableUserData = &workers_;
    library_ = Library::Initialize(params);
    workers_.Start(library_);
}

World::~World() = default;

void World::Run(unsigned operations) {
    CreateSystem();
    CreateView();
    for (unsigned i = 0; i < operations && !stopped_; ++i)
        DoSomething(*this);
    End();
}

SystemSlot* World::AnySystem() {
    return PickLiving(systems_, random_, SystemLives);
}

ViewSlot* World::AnyView() {
    return PickLiving(views_, random_, ViewLives);
}

RendererSlot* World::AnyRenderer() {
    return PickLiving(renderers_, random_, RendererLives);
}

void World::CreateSystem() {
    if (CountLiving(systems_, SystemLives) >= kMostSystems) return;
    auto slot = std::make_unique<SystemSlot>();
    host::Manners manners;
    manners.longest_delay = random_.Chance(50) ? 3 : 12;
    manners.fail = manners.cut = manners.twice = manners.abrupt = 12;
    manners.never = 8;
    manners.from_other_thread = HasResourceThread(mode_);
    manners.in_turn = !HasResourceThread(mode_);
    slot->handler = std::make_unique<host::UnrulyResourceHandler>(site_, random_.Next(), manners);
    SystemSettings settings;
    settings.ResourceHandler = slot->handler.get();
    settings.ResourceRequestsOnWorkers = random_.Chance(30);
    settings.EmbeddedFallbackFont = static_cast<std::int32_t>(random_.Below(3));
    slot->system = library_->CreateSystem(settings);
    systems_.push_back(std::move(slot));
}

void World::CreateView() {
    SystemSlot* system = AnySystem();
    if (!system || CountLiving(views_, ViewLives) >= kMostViews) return;
    auto slot = std::make_unique<ViewSlot>(*this, *system);
    ViewSettings settings;
    settings.Listener = random_.Chance(90) ? slot.get() : nullptr;
    settings.Width = static_cast<std::uint32_t>(random_.Below(300));
    settings.Height = static_cast<std::uint32_t>(random_.Below(200));
    settings.OnFrameComplete = &ViewSlot::OnFrameComplete;
    settings.CallbackUserData = slot.get();
    settings.EnableComplexCSSSelectorsStyling = random_.Chance(70);
    settings.InterceptAllRequests = random_.Chance(20);
    settings.WaitForViewRendererToRecord = random_.Chance(20);
    // A layout thread is of no use to a view that nobody tells about it.
    settings.ExecuteLayoutOnDedicatedThread = HasLayoutThread(mode_) && random_.Chance(50);
    slot->view = system->system->CreateView(settings);
    views_.push_back(std::move(slot));
}

void World::CreateRenderer() {
    ViewSlot* view = AnyView();
    if (!view || CountLiving(renderers_, RendererLives) >= kMostRenderers) return;
    auto slot = std::make_unique<RendererSlot>();
    slot->view = view;
    if (system_renderers_.empty() || random_.Chance(20))
        system_renderers_.push_back(view->system.system->CreateSystemRenderer({}));
    slot->parent = random_.Pick(system_renderers_);
    render_.Call([&] {
        slot->parent->RegisterRenderThread(nullptr, nullptr, 0);
        slot->renderer = slot->parent->CreateViewRenderer(view->view);
        slot->renderer->SetRenderTargetSimple(slot->target.Color(), nullptr, slot->target.Width(),
                                              slot->target.Height(), 1);
    });
    renderers_.push_back(std::move(slot));
}

bool World::IsBusy(const SystemSlot& slot) const {
    return std::any_of(views_.begin(), views_.end(),
                       [&](const auto& view) { return &view->system == &slot && view->depth > 0; });
}

void World::DestroySystem(SystemSlot& slot) {
    const bool refused = IsBusy(slot);
    const auto enter = [&](int change) {
        for (const auto& view : views_)
            if (view->view && &view->system == &slot) view->depth += change;
    };
    // As in DestroyView.
    enter(+1);
    slot.system->Destroy();
    enter(-1);
    if (refused) return;
    slot.system = nullptr;
    for (const auto& view : views_)
        if (&view->system == &slot) view->view = nullptr;
}

void World::DestroyView(ViewSlot& slot) {
    const bool refused = slot.depth > 0;
    View* view = slot.view;
    // Answers to aborted requests may call back while it ends; a second Destroy is refused.
    ++slot.depth;
    view->Destroy();
    --slot.depth;
    if (!refused) slot.view = nullptr;
}

void World::DestroyRenderer(RendererSlot& slot) {
    render_.Call([&] { slot.renderer->Destroy(); });
    slot.renderer = nullptr;
}

void World::StopWorkers() {
    library_->StopWorkers();
    stopped_ = true;
}

void World::ServeWork() {
    library_->ExecuteWork(WorkType::Resources, WorkExecutionMode::RunUntilEmpty, 0);
    if (mode_ != Mode::Polling) return;
    for (const auto& slot : views_)
        if (slot->view && random_.Chance(70))
            library_->ExecuteWork(WorkType::Layout, WorkExecutionMode::RunUntilEmpty,
                                  slot->view->GetTaskFamilyId());
}

void World::React(ViewSlot& slot) {
    if (reactions_ >= 2 || stopped_ || !random_.Chance(25)) return;
    ++reactions_;
    DoSomethingInside(*this, slot);
    --reactions_;
}

void World::DestroyAll(std::size_t kind) {
    switch (kind) {
        case 0:
            while (RendererSlot* slot = AnyRenderer())
                DestroyRenderer(*slot);
            break;
        case 1:
            for (SystemRenderer* renderer : system_renderers_)
                render_.Call([&] { renderer->Destroy(); });
            system_renderers_.clear();
            break;
        case 2:
            while (ViewSlot* slot = AnyView())
                DestroyView(*slot);
            break;
        case 3:
            while (SystemSlot* slot = AnySystem())
                DestroySystem(*slot);
            break;
        default:
            if (!stopped_) StopWorkers();
            break;
    }
}

void World::DestroyInSomeOrder() {
    std::vector<std::size_t> order = {0, 1, 2, 3, 4};
    if (random_.Chance(60)) {
        for (std::size_t i = order.size(); i > 1; --i)
            std::swap(order[i - 1], order[random_.Below(i)]);
        // What is forgotten goes with the library.
        if (random_.Chance(30)) order.pop_back();
    }
    for (const std::size_t kind : order) {
        DestroyAll(kind);
        if (random_.Chance(20))
            for (const auto& slot : systems_)
                slot->handler->Step();
    }
}

void World::End() {
    DestroyInSomeOrder();
    // Late, or never.
    for (const auto& slot : systems_)
        random_.Chance(50) ? (void)slot->handler->AnswerAll() : slot->handler->WaitUntilIdle();
    if (!stopped_) StopWorkers();
    workers_.Stop();
    render_.Call([] {});
    library_->Uninitialize(false);
    const auto count = allocator_.Total();
    if (count.blocks > 0)
        witness_.Fault(std::to_string(count.blocks) + " blocks are left, " + std::to_string(count.bytes) +
                       " bytes");
    if (allocator_.Mismatches() > 0) witness_.Fault("blocks went back under another tag");
}

}  // namespace stress
