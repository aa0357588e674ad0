// A system: what its views share. Main thread.
//
// Members die in reverse order: whatever a view or a task may still reach stands above it.
#pragma once

#include <qorvex/system.h>

#include "core/memory/containers.h"
#include "core/memory/string_pool.h"
#include "core/tasks/task_system.h"
#include "core/view_services.h"
#include "layout/fonts/font_manager.h"
#include "resources/cached_images_manager.h"
#include "resources/cached_svg_manager.h"
#include "resources/font_loader.h"
#include "resources/html_cache.h"
#include "resources/resource_context.h"
#include "resources/stylesheet_cache.h"

namespace qorvex {

class LibraryImpl;
class ViewImpl;

class SystemImpl final : public System, public IViewLifetimeTracker {
  public:
    SystemImpl(LibraryImpl& library, const SystemSettings& settings, uint32_t family);
    ~SystemImpl() override;

    unsigned GetId() const override;
    void SetId(unsigned id) override;
    View* CreateView(const ViewSettings& settings) override;
    SystemCacheStats* CreateCacheStats() override;
    void PruneOrphanedResources() override;
    SystemRenderer* CreateSystemRenderer(const SystemRendererSettings& settings) override;
    SystemRenderer* CreateSystemRendererWithExternalRenderingLibrary() override;
    void ConfigureFontService(void* argument) override;
    void AddUserFont(const char* url, const FontDescription& description, FontSDF::Mode use_sdf) override;
    void AddUserFontFromImages(const UserFontImage* images, unsigned count,
                               const UserFontDescription& description) override;
    void AddUserFontFromEncodedImages(const void** data, const uint32_t* sizes, unsigned count,
                                      const UserFontDescription& description) override;
    void RemoveUserFont(const FontDescription& description) override;
    void Destroy() override;
    void Advance(double time) override;
    void AddGamepad(unsigned id, const char* name, unsigned axes_count, unsigned buttons_count,
                    unsigned display_id) override;
    void RemoveGamepad(unsigned id) override;
    void UpdateGamepadState(const GamepadState& state) override;
    void UpdateGamepadStateExtended(const GamepadStateExtended& state) override;
    void UserImagesChanged(const unsigned* ids, unsigned count) override;
    void PreloadAndCacheStylesheet(const char* url) override;
    bool RemoveStylesheetCacheEntry(const char* url) override;
    void ClearStylesheetCache() override;
    void PreloadAndCacheHTML(const char* url) override;
    bool RemoveHTMLCacheEntry(const char* url) override;
    void ClearHTMLCache() override;

    void OnViewDestroyed(View* view) override;

    void OnWorkersStopped();
    // An operation of one of its views, or its own end, is on the stack.
    bool IsInsideOperation() const;

  private:
    void CheckParts(const SystemSettings& settings) const;
    void StartInspector(const SystemSettings& settings);
    void CreateFontManager(const SystemSettings& settings);
    void ReleaseStrings();
    void AddBitmapFont(const UserFontDescription& description, layout::BitmapFontSourcePtr source);
    layout::FontDescription MakeFontDescription(const FontDescription& description);

    LibraryImpl& library_;
    TaskFamilyHandle family_;
    unsigned id_ = 0;
    StringPool strings_;
    // Of font families, which outlive the views that name them.
    StringPool font_names_;
    css::DefaultRulesPtr default_rules_;
    RefPtr<ResourceContext> resources_;
    HTMLCache html_cache_;
    StylesheetCache stylesheet_cache_;
    // Renderers may outlive the system and still hold it.
    RefPtr<CachedImagesManager> images_;
    RefPtr<CachedSVGManager> svgs_;
    FontLoader font_loader_;
    UniquePtr<layout::FontManager> fonts_;
    ILocalizationManager* localization_;
    ITextTransformationManager* text_transformation_;
    IInternationalizationManager* internationalization_;
    Vector<ViewImpl*> views_;
    bool destroying_ = false;
};

}  // namespace qorvex
