// The optional interfaces that Library::GetFeatureInterface gives out, and the console sink behind one of
// them. Main thread.
#pragma once

#include <qorvex/feature_interfaces.h>

namespace qorvex {

class FrameStatsInterface final : public IFrameStats {
  public:
    void SetEnabled(View* view, bool enabled) override;
    bool GetFrame(View* view, uint32_t frame_id, FrameStats* out) override;
};

class DebugInterface final : public IDebugInterface {
  public:
    bool VisitElementBoxes(View* view, ElementBoxCallback callback, void* user_data) override;
    bool VisitComputedStyle(View* view, const char* selector, StyleCallback callback,
                            void* user_data) override;
    unsigned GetPendingWork(View* view) override;
    bool IsLoaded(View* view) override;
    bool HasChanged(View* view) override;
    void SetConsoleCallback(ConsoleCallback callback, void* user_data) override;

    // Gives a page's console line to the callback; false when there is none.
    bool ForwardConsoleLine(const ConsoleMessage& message) const;

  private:
    ConsoleCallback console_callback_ = nullptr;
    void* console_user_data_ = nullptr;
};

class LayoutDebugging final : public ILayoutDebugging {
  public:
    void SetFlexAlgorithm(View* view, unsigned algorithm) override;
};

class CacheSimAccess final : public ICacheSimAccess {};

class DebugInterfaces {
  public:
    // Null for an unknown id.
    void* Get(unsigned id);
    const DebugInterface& GetDebugInterface() const { return debug_; }

  private:
    FrameStatsInterface frame_stats_;
    DebugInterface debug_;
    LayoutDebugging layout_debugging_;
    CacheSimAccess cache_sim_;
};

}  // namespace qorvex
