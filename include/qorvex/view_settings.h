// The record that System::CreateView takes.
#pragma once

#include <cstdint>

namespace qorvex {

class ITextInputHandler;
class IViewListener;

// Fires once for each Advance: when the frame's recording is finished (on the layout thread; on the main
// thread in synchronous mode, and when the next Advance finds the frame not begun by any thread), or, for a
// frame with nothing to do, inside Advance. The last argument is 0.
using OnFrameCompleteCallback = void (*)(void* userData, std::uint32_t viewId, std::uint32_t frameId,
                                         std::uint32_t reserved);
// The page's clock in milliseconds. Main thread.
using GetCurrentTimeCallback = double (*)(void* userData, std::uint32_t viewId);

// All pointers are borrowed for the life of the view; texts are copied.
struct ViewSettings {
    IViewListener* Listener = nullptr;
    std::uint32_t Width = 0;  // pixels
    std::uint32_t Height = 0;
    OnFrameCompleteCallback OnFrameComplete = nullptr;
    // Null: the time given to the last Advance.
    GetCurrentTimeCallback GetCurrentTime = nullptr;
    void* CallbackUserData = nullptr;
    // True: descendant, child and sibling selectors are matched, at the cost of more restyling.
    bool EnableComplexCSSSelectorsStyling = false;
    // True: IViewListener::OnResourceRequestIntercepted is asked before each load.
    bool InterceptAllRequests = false;
    // Handed to the rendering library when the view's scene is created.
    std::uint32_t SceneParams[3] = {0, 0, 0};
    // Longest time between two clicks that make a "dblclick", in the unit of Advance's time.
    std::uint32_t DoubleClickInterval = 500;
    ITextInputHandler* TextInputHandler = nullptr;
    // Distance in pixels that a pan must cover on an axis before it scrolls.
    float GestureScrollThreshold = 20.0f;
    // True: layout runs on the thread that serves ExecuteWork(Layout) for this view's family. So it does for
    // every view when the library has UseDedicatedLayoutThread. False: inside Advance.
    bool ExecuteLayoutOnDedicatedThread = false;
    // True: nothing is recorded while the view has no ViewRenderer.
    bool WaitForViewRendererToRecord = false;
    // Switches, found by plain substring search. Null is allowed.
    //   --disable-flex-basis-units  flex-basis counts as pixels whatever its unit
    const char* AdditionalOptions = nullptr;
};

}  // namespace qorvex
