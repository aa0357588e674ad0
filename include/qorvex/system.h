// The per-client root below the library: caches, fonts, gamepads, and the views that share them.
#pragma once

#include <qorvex/fonts.h>
#include <qorvex/input_events.h>

#include <cstdint>

namespace qorvex {

class IAsyncResourceHandler;
class IDataStorageHandler;
class IInternationalizationManager;
class ILocalizationManager;
class ITextTransformationManager;
class SystemCacheStats;
class SystemRenderer;
class View;
struct SystemRendererSettings;
struct ViewSettings;

// Requests whose URL ends in "." and Name are made with the first target as extension instead; the other
// targets are offered as IAsyncResourceRequest::GetAlternativeURLs.
struct ResourceMapping {
    const char* Name = nullptr;
    const char** Targets = nullptr;
    std::uint32_t TargetCount = 0;
};

// When images that nothing shows any more are given up: cleaning starts above the first pair and goes on down
// to the second.
struct CacheLimits {
    std::uint32_t MaxCount = 0;
    std::uint32_t MaxBytes = 0;
    std::uint32_t TargetCount = 0;
    std::uint32_t TargetBytes = 0;
};

// Interfaces are borrowed and must outlive the system; texts and tables are copied. Null is allowed for every
// pointer but ResourceHandler.
struct SystemSettings {
    const ResourceMapping* ResourceMappings = nullptr;
    std::uint32_t ResourceMappingCount = 0;
    IAsyncResourceHandler* ResourceHandler = nullptr;
    IDataStorageHandler* DataStorageHandler = nullptr;
    ILocalizationManager* LocalizationManager = nullptr;
    ITextTransformationManager* TextTransformationManager = nullptr;
    IInternationalizationManager* InternationalizationManager = nullptr;
    CacheLimits ImageCacheLimits;
    CacheLimits SVGCacheLimits;
    std::uint32_t InspectorPort = 0;  // TCP port, 1 to 65535
    bool EnableInspector = false;
    // True: the resource handler is called on threads inside ExecuteWork(Resources), not on the main thread.
    bool ResourceRequestsOnWorkers = false;
    // Overrides the library's family of last resort when it names a known family.
    const char* DefaultFontFamily = nullptr;
    // The engine's own font behind all others: 0 none, 1 the small one (three glyphs), other values the large
    // one (printable ASCII).
    std::int32_t EmbeddedFallbackFont = 0;
};

// All operations run on the main thread.
class System {
  public:
    // 0 to 15; systems beyond the sixteenth share 0.
    virtual unsigned GetId() const = 0;
    virtual void SetId(unsigned id) = 0;

  protected:
    virtual ~System() = default;

  public:
    // Released with View::Destroy, before the system.
    virtual View* CreateView(const ViewSettings& settings) = 0;

    // A snapshot of the image cache. Released with SystemCacheStats::Destroy.
    virtual SystemCacheStats* CreateCacheStats() = 0;
    // Gives up every image and SVG that nothing shows.
    virtual void PruneOrphanedResources() = 0;

    // Render thread. Which of the two works depends on who started the rendering library; the other logs an
    // error and returns null. Released with SystemRenderer::Destroy.
    virtual SystemRenderer* CreateSystemRenderer(const SystemRendererSettings& settings) = 0;
    virtual SystemRenderer* CreateSystemRendererWithExternalRenderingLibrary() = 0;

    // Handed to the font service of the rendering library, unseen by the engine.
    virtual void ConfigureFontService(void* argument) = 0;
    virtual void AddUserFont(const char* url, const FontDescription& description, FontSDF::Mode useSDF) = 0;
    virtual void AddUserFontFromImages(const UserFontImage* images, unsigned count,
                                       const UserFontDescription& description) = 0;
    // Encoded image files (PNG, JPEG, WebP, GIF); everything is copied and decoded on a resource thread.
    virtual void AddUserFontFromEncodedImages(const void** data, const std::uint32_t* sizes, unsigned count,
                                              const UserFontDescription& description) = 0;
    virtual void RemoveUserFont(const FontDescription& description) = 0;

    // Every view must be gone; one that is not is destroyed with an Error line. Requests that are still on
    // their way are aborted and not waited for: late answers go nowhere. Waits only for work that other
    // threads are in the middle of. Refused, with an Error line, inside an operation of one of its views.
    virtual void Destroy() = 0;

    // Once per game frame, beside the views' Advance: results that belong to no single view.
    virtual void Advance(double time) = 0;

    virtual void AddGamepad(unsigned id, const char* name, unsigned axesCount, unsigned buttonsCount,
                            unsigned displayId) = 0;
    virtual void RemoveGamepad(unsigned id) = 0;
    virtual void UpdateGamepadState(const GamepadState& state) = 0;
    virtual void UpdateGamepadStateExtended(const GamepadStateExtended& state) = 0;

    // The contents of images given with IAsyncResourceResponse::RecieveUserImage have changed.
    virtual void UserImagesChanged(const unsigned* ids, unsigned count) = 0;

    // Pages and stylesheets by absolute URL, loaded and parsed ahead of any view and kept until removed.
    virtual void PreloadAndCacheStylesheet(const char* url) = 0;
    virtual bool RemoveStylesheetCacheEntry(const char* url) = 0;
    virtual void ClearStylesheetCache() = 0;
    virtual void PreloadAndCacheHTML(const char* url) = 0;
    virtual bool RemoveHTMLCacheEntry(const char* url) = 0;
    virtual void ClearHTMLCache() = 0;
};

}  // namespace qorvex
