// A look into a page from outside, for players, tests and tools: the feature interface kDebugFeature.
#pragma once

#include <cstddef>
#include <cstdint>

namespace qorvex {

class View;

// An id of this project's own, beyond those that the engine family shares.
constexpr unsigned kDebugFeature = 0x51000002u;

// One element in document order. Texts are valid during the call.
struct ElementBox {
    const char* Tag = nullptr;  // lower case
    const char* Id = nullptr;   // "" when absent
    // As getBoundingClientRect gives it; all zero for an element that takes no part in layout.
    float X = 0;
    float Y = 0;
    float Width = 0;
    float Height = 0;
};

// A console call of a page. The text is UTF-8 without a line end; severity as in the log.
struct ConsoleMessage {
    std::uint32_t ViewId = 0;
    std::uint32_t Severity = 2;
    const char* Text = nullptr;
    std::size_t Length = 0;
};

using ElementBoxCallback = void (*)(void* userData, const ElementBox& box);
using StyleCallback = void (*)(void* userData, const char* name, const char* value);
using ConsoleCallback = void (*)(void* userData, const ConsoleMessage& message);

// Main thread, outside of Advance.
class IDebugInterface {
  public:
    // Every element from body on. False without a document.
    virtual bool VisitElementBoxes(View* view, ElementBoxCallback callback, void* userData) = 0;

    // Every longhand of the first element that matches the selector, in the order of the property table.
    // False when nothing matches or the selector does not parse.
    virtual bool VisitComputedStyle(View* view, const char* selector, StyleCallback callback,
                                    void* userData) = 0;

    // How many answers the page still waits for: resource requests that the client has not finished and
    // resource work that ExecuteWork has not done. While it is 0, an Advance depends on nothing but its time.
    // The count never misses work: what a finished piece of work leads to is counted before that piece is
    // discounted.
    virtual unsigned GetPendingWork(View* view) = 0;

    // True when the page's "load" event has been sent.
    virtual bool IsLoaded(View* view) = 0;

    // True when the last Advance gave the layout side something to do; false when nothing had changed.
    virtual bool HasChanged(View* view) = 0;

    // Console calls of all pages go to the callback instead of the log. They come on the main thread, inside
    // a public call. Null restores the log.
    virtual void SetConsoleCallback(ConsoleCallback callback, void* userData) = 0;

  protected:
    virtual ~IDebugInterface() = default;
};

}  // namespace qorvex
