// What a system lends to its views. All of it outlives them.
#pragma once

#include <cstdint>

#include "core/memory/containers.h"
#include "css/style/style_engine.h"

namespace fresco {
class IRenderingLibrary;
}

namespace qorvex {

class CachedImagesManager;
class CachedSVGManager;
class HTMLCache;
class ILocalizationManager;
class IInternationalizationManager;
class ITextTransformationManager;
class ResourceContext;
class StringPool;
class StylesheetCache;
class TaskSystem;
class TimerQueue;
class View;

namespace layout {
class FontManager;
}

// Told when a view ends.
class IViewLifetimeTracker {
  public:
    virtual ~IViewLifetimeTracker() = default;
    virtual void OnViewDestroyed(View* view) = 0;
};

struct ViewServices {
    TaskSystem* tasks = nullptr;
    TimerQueue* library_timers = nullptr;
    StringPool* strings = nullptr;
    ResourceContext* resources = nullptr;
    HTMLCache* html_cache = nullptr;
    StylesheetCache* stylesheet_cache = nullptr;
    CachedImagesManager* images = nullptr;
    CachedSVGManager* svgs = nullptr;
    css::DefaultRulesPtr default_rules;
    layout::FontManager* fonts = nullptr;
    ILocalizationManager* localization = nullptr;
    ITextTransformationManager* text_transformation = nullptr;
    IInternationalizationManager* internationalization = nullptr;
    fresco::IRenderingLibrary* rendering = nullptr;
    IViewLifetimeTracker* lifetime_tracker = nullptr;
    bool use_dedicated_layout_thread = false;
    bool snap_to_pixels = true;
    bool preload_font_data = true;
};

}  // namespace qorvex
