// What a sequence is made of: one row an operation of the public interfaces, with how often it comes.
#include <limits>
#include <string>

#include "world.h"

namespace stress {

using namespace qorvex;

namespace {

struct Operation {
    const char* name;
    unsigned weight;
    void (*run)(World& world);
};

unsigned AnySize(Random& random) {
    static constexpr unsigned kSizes[] = {0, 1, 2, 17, 64, 100, 320, 1000, 4000};
    return random.Pick(kSizes);
}

double AnyTime(Random& random, ViewSlot& slot) {
    static constexpr double kForward[] = {16, 16, 16, 16, 33, 0, 500, 1e7};
    static constexpr double kWrong[] = {-5, -1e6, std::numeric_limits<double>::quiet_NaN(),
                                        std::numeric_limits<double>::infinity()};
    return random.Chance(5) ? slot.time + random.Pick(kWrong) : slot.time += random.Pick(kForward);
}

// Runs `body` on a view, if there is one.
template <class Body>
void OnView(World& world, Body body) {
    if (ViewSlot* slot = world.AnyView()) world.Call(*slot, [&](View& view) { body(view, world.Rng()); });
}

template <class Body>
void OnSystem(World& world, Body body) {
    if (SystemSlot* slot = world.AnySystem()) body(*slot->system, world.Rng());
}

// Some frames as a game makes them.
void AdvanceFrames(World& world) {
    const std::size_t frames = 1 + world.Rng().Below(4);
    for (std::size_t i = 0; i < frames && !world.IsStopped(); ++i) {
        if (SystemSlot* system = world.AnySystem()) {
            system->handler->Step();
            system->system->Advance(static_cast<double>(i));
        }
        if (!HasResourceThread(world.GetMode()) || world.Rng().Chance(10)) world.ServeWork();
        if (ViewSlot* slot = world.AnyView()) {
            const double time = AnyTime(world.Rng(), *slot);
            world.Call(*slot, [&](View& view) { view.Advance(time); });
        }
    }
}

void PaintFrame(World& world, RendererSlot& slot, std::uint32_t id);

// A page from its request to its pixels, as far as the answers come.
void ShowPage(World& world) {
    world.CreateRenderer();
    RendererSlot* slot = world.AnyRenderer();
    if (!slot || !slot->view->view) return;
    ViewSlot& shown = *slot->view;
    world.Call(shown, [&](View& view) { view.LoadURL(world.Rng().Pick(kPages)); });
    for (int frame = 0; frame < 12 && !world.IsStopped(); ++frame) {
        if (!shown.view || !slot->renderer) return;
        shown.system.handler->Step();
        shown.system.system->Advance(shown.time);
        if (!HasResourceThread(world.GetMode())) world.ServeWork();
        world.Call(shown, [&](View& view) { view.Advance(shown.time += 16); });
        if (!slot->renderer) return;
        PaintFrame(world, *slot, shown.frames.load() - static_cast<std::uint32_t>(frame % 2));
    }
}

void Paint(World& world) {
    RendererSlot* slot = world.AnyRenderer();
    if (!slot) return;
    // The last frame, an old one, one that was painted before, or one that never was.
    static constexpr std::uint32_t kBack[] = {1, 1, 1, 1, 2, 3, 50, 0, 0x80000000u};
    PaintFrame(world, *slot, slot->view->frames.load() - world.Rng().Pick(kBack));
}

void PaintFrame(World& world, RendererSlot& slot, std::uint32_t id) {
    const bool may_wait = world.GetMode() == Mode::Sync || world.Render().IsThread();
    const bool wait = may_wait && world.Rng().Chance(50);
    const bool twice = world.Rng().Chance(20);
    ViewRenderer* renderer = slot.renderer;
    Witness& log = world.Log();
    world.Render().Post([renderer, id, wait, twice, &log] {
        const PaintStatus first = renderer->Paint(id, wait);
        if (!twice) return;
        const PaintStatus second = renderer->Paint(id, wait);
        if (first == PaintStatus::Complete && second != PaintStatus::FrameMissing)
            log.Fault("frame " + std::to_string(id) + " is painted twice");
    });
}

void FreeResources(World& world) {
    RendererSlot* slot = world.AnyRenderer();
    if (!slot) return;
    ViewRenderer* renderer = slot->renderer;
    world.Render().Post([renderer] { renderer->FreeRenderingResources(); });
}

void SendInput(View& view, Random& random) {
    MouseEventData mouse;
    mouse.Type = static_cast<MouseEventData::EventType>(random.Below(4));
    mouse.X = static_cast<std::int32_t>(random.Below(400)) - 50;
    mouse.Y = static_cast<std::int32_t>(random.Below(300)) - 50;
    view.MouseEvent(mouse, nullptr, nullptr);
    KeyEventData key;
    key.Type = static_cast<KeyEventData::EventType>(random.Below(4));
    key.KeyCode = static_cast<std::int32_t>(random.Below(130));
    view.KeyEvent(key, nullptr, nullptr);
    TouchEventData touch;
    touch.Type = static_cast<TouchEventData::EventType>(random.Below(3));
    view.TouchEvent(&touch, 1, nullptr, nullptr);
}

void ChangeCaches(View& view, Random& random) {
    static constexpr CacheType kTypes[] = {CacheType::Shadows, CacheType::Paths, CacheType::RenderingLibrary,
                                           CacheType::ScratchLayers, CacheType::ScratchTextures};
    view.SetCacheCountSize(random.Pick(kTypes), AnySize(random));
    view.SetCacheBytesSize(random.Pick(kTypes), 1u << random.Below(28));
    view.ClearCaches(static_cast<std::uint32_t>(random.Below(64)));
}

void Dump(View& view, Random&) {
    if (DebugDump* dump = view.DumpDOM(0)) dump->Destroy();
    if (DebugDump* dump = view.DumpStackingContexts()) dump->Destroy();
}

void Flip(View& view, Random& random) {
    const bool on = random.Chance(50);
    switch (random.Below(5)) {
        case 0:
            return view.EnableRendering(on || random.Chance(50));
        case 1:
            return view.ContinuousRepaint(on);
        case 2:
            return view.ShowPaintRectangles(on);
        case 3:
            return view.SetPaintOption(on);
        default:
            return view.EnableGPUMetadataEmission(on);
    }
}

void Capture(View& view, Random& random) {
    const auto look = [](void*, const FrameCapture& capture) { (void)capture.GetSize(); };
    switch (random.Below(3)) {
        case 0:
            return view.CaptureNextFrame(look, nullptr);
        case 1:
            return view.BeginCaptureFrames(look, nullptr);
        default:
            return view.EndCaptureFrames();
    }
}

void UseSystemCaches(System& system, Random& random) {
    const char* page = random.Pick(kPages);
    const char* sheet = random.Pick(kSheets);
    switch (random.Below(7)) {
        case 0:
            return system.PreloadAndCacheHTML(page);
        case 1:
        case 2:
            return system.PreloadAndCacheStylesheet(sheet);
        case 3:
            return (void)system.RemoveHTMLCacheEntry(page);
        case 4:
            return (void)system.RemoveStylesheetCacheEntry(sheet);
        case 5:
            return system.ClearHTMLCache();
        default:
            return system.ClearStylesheetCache();
    }
}

void UseFonts(System& system, Random& random) {
    FontDescription font;
    font.FamilyName = random.Chance(50) ? "Game" : "Other";
    if (random.Chance(70))
        system.AddUserFont("coui://stress/game.ttf", font, FontSDF::Auto);
    else
        system.RemoveUserFont(font);
}

constexpr Operation kOperations[] = {
    {"Advance", 220, AdvanceFrames},
    {"ShowPage", 30, ShowPage},
    {"LoadURL", 20,
     [](World& world) { OnView(world, [](View& v, Random& r) { v.LoadURL(r.Pick(kPages)); }); }},
    {"Reload", 8, [](World& world) { OnView(world, [](View& v, Random&) { v.Reload(); }); }},
    {"UnloadDocument", 8, [](World& world) { OnView(world, [](View& v, Random&) { v.UnloadDocument(); }); }},
    {"Resize", 20,
     [](World& world) { OnView(world, [](View& v, Random& r) { v.Resize(AnySize(r), AnySize(r)); }); }},
    {"SetVirtualResolution", 4,
     [](World& world) {
         OnView(world, [](View& v, Random& r) { v.SetVirtualResolution(AnySize(r), AnySize(r)); });
     }},
    {"ExecuteScript", 60,
     [](World& world) { OnView(world, [](View& v, Random& r) { v.ExecuteScript(r.Pick(kScripts)); }); }},
    {"AddInitialScript", 6,
     [](World& world) {
         OnView(world, [](View& v, Random& r) {
             r.Chance(80) ? v.AddInitialScript(r.Chance(90) ? r.Pick(kScripts) : nullptr)
                          : v.ClearInitialScripts();
         });
     }},
    {"Input", 20, [](World& world) { OnView(world, SendInput); }},
    {"Caches", 8, [](World& world) { OnView(world, ChangeCaches); }},
    {"Dump", 6, [](World& world) { OnView(world, Dump); }},
    {"Flip", 20, [](World& world) { OnView(world, Flip); }},
    {"Capture", 8, [](World& world) { OnView(world, Capture); }},
    {"ClearListeners", 1, [](World& world) { OnView(world, [](View& v, Random&) { v.ClearListeners(); }); }},
    {"Paint", 120, Paint},
    {"FreeRenderingResources", 4, FreeResources},
    {"ServeWork", 30, [](World& world) { world.ServeWork(); }},
    {"SystemCaches", 25, [](World& world) { OnSystem(world, UseSystemCaches); }},
    {"Fonts", 6, [](World& world) { OnSystem(world, UseFonts); }},
    {"Answer", 30,
     [](World& world) {
         if (SystemSlot* slot = world.AnySystem())
             world.Rng().Chance(90) ? slot->handler->Step() : slot->handler->AnswerAll();
     }},
    {"CreateSystem", 6, [](World& world) { world.CreateSystem(); }},
    {"CreateView", 20, [](World& world) { world.CreateView(); }},
    {"CreateRenderer", 30, [](World& world) { world.CreateRenderer(); }},
    {"DestroySystem", 3,
     [](World& world) {
         if (SystemSlot* slot = world.AnySystem()) world.DestroySystem(*slot);
     }},
    {"DestroyView", 12,
     [](World& world) {
         if (ViewSlot* slot = world.AnyView()) world.DestroyView(*slot);
     }},
    {"DestroyRenderer", 8,
     [](World& world) {
         if (RendererSlot* slot = world.AnyRenderer()) world.DestroyRenderer(*slot);
     }},
    {"StopWorkers", 1,
     [](World& world) {
         if (world.Rng().Chance(20)) world.StopWorkers();
     }},
};

}  // namespace

const char* DoSomething(World& world) {
    unsigned sum = 0;
    for (const Operation& operation : kOperations)
        sum += operation.weight;
    std::size_t draw = world.Rng().Below(sum);
    for (const Operation& operation : kOperations) {
        if (draw < operation.weight) {
            operation.run(world);
            return operation.name;
        }
        draw -= operation.weight;
    }
    return "";
}

void DoSomethingInside(World& world, ViewSlot& slot) {
    Random& random = world.Rng();
    if (!slot.view) return;
    switch (random.Below(6)) {
        case 0:  // refused
            return world.DestroyView(slot);
        case 1:
            if (slot.system.system) world.DestroySystem(slot.system);
            return;
        case 2:
            return world.Call(slot, [&](View& view) { view.Advance(AnyTime(random, slot)); });
        case 3:
            return world.Call(slot, [&](View& view) { view.LoadURL(random.Pick(kPages)); });
        default:
            DoSomething(world);
    }
}

}  // namespace stress
