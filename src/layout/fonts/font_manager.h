// Turns font descriptions into fonts of the rendering library, one manager for each system.
//
// A font never blocks a frame: while a description is loading, whoever asked is kept as a waiter, its
// typeface slot stays empty, and it is told when the font has come. A description is unknown, pending or
// loaded; pending ends in loaded, or in unknown after a failed load, which is not tried again by itself. DOM
// thread only, but for the completion of a load, which runs on a resource thread and only loads faces and
// posts a task.
#pragma once

#include <fresco/font.h>

#include "core/memory/containers.h"
#include "core/memory/string_pool.h"
#include "core/tasks/task_system.h"
#include "css/parser/stylesheet.h"
#include "layout/fonts/bitmap_font_source.h"
#include "layout/fonts/font_description.h"
#include "layout/fonts/font_resolver.h"
#include "layout/fonts/font_resource_loader.h"

namespace qorvex::layout {

struct FontManagerSettings {
    fresco::IFontService& service;
    TaskFamilyHandle family;  // of the manager alone
    IFontResourceLoader& loader;
    StringPool& strings;
    // The family of generic names. The first one that the service knows counts; null is skipped.
    const char* defaultFamilies[2] = {nullptr, nullptr};
    // 0 none, 1 the small one, any other value the large one.
    int32_t embeddedFallbackFont = 0;
};

class FontManager final : public IFontResolver {
  public:
    explicit FontManager(const FontManagerSettings& settings);
    // Closes its channels, which waits for loads that are being worked on.
    ~FontManager();
    FontManager(const FontManager&) = delete;
    FontManager& operator=(const FontManager&) = delete;

    fresco::IFontService& Service() { return service_; }
    // Results of loads. Part of the system's and the views' Advance.
    void RunMainTasks();

    // Null while the font is not there; the waiter (may be null) is kept when it is pending.
    fresco::IFont* GetFont(const FontDescription& description, const NodeLinkPtr& waiter);
    void SetDefaultFont(std::string_view family);

    // Loads a font file for a description that has no font yet. useSDF: 0 off, 1 on, 2 auto.
    void AddFontDescription(const FontDescription& description, const URL& url, uint32_t useSDF);
    bool RemoveFontDescription(const FontDescription& description);
    // A font of pictures; replaces a font of the description that is there.
    void AddBitmapFont(const FontDescription& description, BitmapFontSourcePtr source);

    void ResolveTypefaces(const css::FontFamily& families, css::FontStyle style, uint8_t weight,
                          const NodeLinkPtr& waiter, TypefaceList& out) override;
    void AddFontFace(const css::FontFace& face) override;

  private:
    using WaiterList = SmallVector<NodeLinkPtr, 2, MemoryTag::General>;

    void LoadFallbackFont(int32_t which);
    // On a resource thread: loads every face of the stream that is wanted and posts the results.
    static void LoadFaces(fresco::IFontService& service, TaskFamilyHandle family, FontManager& manager,
                          fresco::IStreamReader* reader, const FontDescription& description, const URL& url,
                          fresco::SdfMode sdf);
    void OnFaceLoaded(fresco::FontId id, FontDescription description, const FontDescription& asked);
    void CreateBitmapFont(const FontDescription& description, const BitmapFontSource* source);
    void OnLoadFailed(const FontDescription& description);
    void TellWaiters(const FontDescription& description);

    fresco::IFontService& service_;
    TaskFamilyHandle family_;
    IFontResourceLoader& loader_;
    StringPool& strings_;
    HashMap<FontDescription, fresco::FontId, MemoryTag::General> loaded_;
    HashMap<FontDescription, WaiterList, MemoryTag::General> pending_;
    Atom default_family_;
    fresco::FontId fallback_ = fresco::kNoId;
};

}  // namespace qorvex::layout
