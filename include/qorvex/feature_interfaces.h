// Optional interfaces that Library::GetFeatureInterface gives out by id. The objects belong to the library,
// are made on first use and live until Uninitialize.
#pragma once

#include <qorvex/debug_interface.h>
#include <qorvex/frame_stats.h>

namespace qorvex {

class View;

constexpr unsigned kCacheSimFeature = 5;
constexpr unsigned kLayoutDebuggingFeature = 6;

// Lets a developer try cache sizes. Has no operation yet.
class ICacheSimAccess {
  public:
    virtual ~ICacheSimAccess() = default;
};

// Main thread.
class ILayoutDebugging {
  public:
    // 0 is Yoga, 1 the engine's own flex implementation; other values count as 0. The next Advance lays out
    // the whole page.
    virtual void SetFlexAlgorithm(View* view, unsigned algorithm) = 0;

    virtual ~ILayoutDebugging() = default;
};

}  // namespace qorvex
