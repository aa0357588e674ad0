// The faces of a rendering library. One lock guards the list and the FreeType library object; faces
// themselves never move and never go before the service.
#pragma once
#include <shared_mutex>
#include <string_view>

#include "fresco/fonts/scalable_face.h"
#include "fresco/fonts/system_fonts.h"

struct FT_MemoryRec_;

namespace fresco {

class FontService final : public IFontService {
  public:
    FontService();
    ~FontService() override;

    void Configure(void* argument) override;
    uint32_t GetFaceCount(IStreamReader* stream) override;
    FontId LoadFace(IStreamReader* stream, uint32_t faceIndex, SdfMode sdf, uint32_t wantedFlags) override;
    FontId RegisterBitmapFont(IStreamReader* stream, const BitmapFontDescription& description) override;
    FontId FindFont(const char* family, uint32_t flags) override;
    IFont* GetFont(FontId id) override { return FindFace(id); }

    // Before the first search.
    void SetOptions(const char* options) { system_.SetOptions(options); }
    void SetFiles(IFileManipulator* files) { system_.SetFiles(files); }

    const FontFace* GetFace(FontId id) const { return const_cast<FontService*>(this)->FindFace(id); }
    // For replays: a face under the id that it had when it was captured.
    bool LoadFaceAs(FontId id, const void* data, size_t size, uint32_t faceIndex, SdfMode sdf);
    bool RegisterBitmapFontAs(FontId id, std::string_view table, const BitmapFontDescription& description);

  private:
    FontFace* FindFace(FontId id);
    // For an id that a capture names.
    bool IsFree(FontId id) const { return id != kNoId && id < kNoId - 1 && !faces_.count(id); }
    bool AddBitmapFace(FontId id, std::string_view table, const BitmapFontDescription& description);
    FontId FindLoaded(const char* family, uint32_t flags) const;
    bool LoadSystemFonts();
    FontDataPtr ShareData(FontDataPtr data) const;
    using ScalablePtr = std::unique_ptr<ScalableFace, HeapDeleter<ScalableFace>>;
    ScalablePtr MakeFace(FontDataPtr data, uint32_t faceIndex, SdfMode sdf, FontId id);
    template <class Face>
    void Keep(std::unique_ptr<Face, HeapDeleter<Face>> face);
    bool AddFace(FontDataPtr data, uint32_t faceIndex, SdfMode sdf, FontId id, uint32_t wantedFlags);
    void AddInstances(const FontDataPtr& data, uint32_t faceIndex, SdfMode sdf);

    mutable std::shared_mutex mutex_;
    FT_MemoryRec_* memory_ = nullptr;
    FT_LibraryRec_* library_ = nullptr;
    ShapeSettings settings_;  // before the faces, which read them
    HashMap<FontId, std::unique_ptr<FontFace, HeapDeleter<FontFace>>> faces_;
    Vector<FontId> order_;  // as loaded: FindFont takes the last match
    FontId nextId_ = 0;
    SystemFonts system_;
};

}  // namespace fresco
