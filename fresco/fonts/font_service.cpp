#include "fresco/fonts/font_service.h"

#include <ft2build.h>
#include FT_FREETYPE_H
#include FT_MODULE_H

#include <hb.h>

#include <algorithm>
#include <cstring>

#include "fresco/core/log.h"
#include "fresco/fonts/bitmap_face.h"

namespace fresco {
namespace {

// A glyph table has a line of some hundred bytes for a character.
constexpr size_t kMaxTableBytes = size_t(16) << 20;
// Instances of a variable font that names find; usual ones have 9 weights, upright and slanted.
constexpr uint32_t kMaxInstances = 64;
// Faces of a collection; those of all East Asian scripts and weights are fewer.
constexpr FT_Long kMaxFaces = 256;
constexpr size_t kFontAlignment = 16;

// FreeType's own memory, from the client. Blocks carry their size in front for Realloc.
struct BlockHeader {
    size_t size;
    size_t unused;
};

void* FtAllocate(FT_Memory, long size) {
    // A packed font says itself how large it becomes.
    if (size <= 0 || size_t(size) > 2 * kMaxFontBytes) return nullptr;
    auto* header =
        static_cast<BlockHeader*>(HeapAllocate(size_t(size) + sizeof(BlockHeader), kFontAlignment));
    if (!header) return nullptr;
    header->size = size_t(size);
    return header + 1;
}

void FtFree(FT_Memory, void* block) {
    if (block) HeapFree(static_cast<BlockHeader*>(block) - 1, kFontAlignment);
}

void* FtReallocate(FT_Memory memory, long, long newSize, void* block) {
    void* moved = FtAllocate(memory, newSize);
    if (!moved || !block) return moved;
    const size_t oldSize = (static_cast<BlockHeader*>(block) - 1)->size;
    std::memcpy(moved, block, std::min(oldSize, size_t(newSize)));
    FtFree(memory, block);
    return moved;
}

bool EqualFamily(const char* a, const char* b) {
    const auto lower = [](char c) { return c >= 'A' && c <= 'Z' ? char(c + 32) : c; };
    while (*a && lower(*a) == lower(*b))
        ++a, ++b;
    return *a == *b;
}

}  // namespace

FontService::FontService() {
    memory_ = HeapNew<FT_MemoryRec_>();
    if (!memory_) return;
    memory_->user = nullptr;
    memory_->alloc = FtAllocate;
    memory_->free = FtFree;
    memory_->realloc = FtReallocate;
    if (FT_New_Library(memory_, &library_)) {
        library_ = nullptr;
        return;
    }
    FT_Add_Default_Modules(library_);
}

FontService::~FontService() {
    faces_.clear();
    if (library_) FT_Done_Library(library_);
    HeapDelete(memory_);
}

void FontService::Configure(void* argument) {
    const auto* wanted = static_cast<const FontServiceConfiguration*>(argument);
    if (!wanted) return;
    if (wanted->structSize < sizeof(FontServiceConfiguration)) {
        FRESCO_WARN("IFontService::Configure: the configuration is of another version");
        return;
    }
    if (wanted->language)
        settings_.language = *wanted->language ? hb_language_from_string(wanted->language, -1) : nullptr;
    if (wanted->keptGlyphs) settings_.keptGlyphs = wanted->keptGlyphs;
}

FontId FontService::RegisterBitmapFont(IStreamReader* stream, const BitmapFontDescription& description) {
    Vector<uint8_t> table;
    if (!ReadAll(stream, &table, kMaxTableBytes)) return kNoId;
    const std::string_view text(reinterpret_cast<const char*>(table.data()), table.size());
    std::lock_guard lock(mutex_);
    const FontId id = nextId_;
    return AddBitmapFace(id, text, description) ? id : kNoId;
}

bool FontService::AddBitmapFace(FontId id, std::string_view table, const BitmapFontDescription& description) {
    std::unique_ptr<BitmapFace, HeapDeleter<BitmapFace>> face(HeapNew<BitmapFace>());
    if (!face || !face->Load(table, description, id)) return false;
    Keep(std::move(face));
    return true;
}

uint32_t FontService::GetFaceCount(IStreamReader* stream) {
    Vector<uint8_t> copy;
    std::span<const uint8_t> bytes = InPlace(stream);
    if (bytes.empty()) {
        if (!ReadAll(stream, &copy)) return 0;
        bytes = copy;
    }
    std::lock_guard lock(mutex_);
    FT_Face face = nullptr;
    if (!library_ || FT_New_Memory_Face(library_, bytes.data(), FT_Long(bytes.size()), -1, &face)) return 0;
    const FT_Long count = face->num_faces;
    FT_Done_Face(face);
    return uint32_t(std::clamp<FT_Long>(count, 0, kMaxFaces));
}

// The faces of a collection come as one file each time; keep its bytes once.
FontDataPtr FontService::ShareData(FontDataPtr data) const {
    const auto same = [&](const auto& entry) {
        return std::ranges::equal(entry.second->GetBytes(), data->bytes());
    };
    const auto found = std::find_if(faces_.begin(), faces_.end(), same);
    return found == faces_.end() ? data : found->second->ShareData();
}

FontService::ScalablePtr FontService::MakeFace(FontDataPtr data, uint32_t faceIndex, SdfMode sdf, FontId id) {
    ScalablePtr face(library_ ? HeapNew<ScalableFace>(settings_) : nullptr);
    return face && face->Load(library_, std::move(data), faceIndex, sdf, id) ? std::move(face) : nullptr;
}

template <class Face>
void FontService::Keep(std::unique_ptr<Face, HeapDeleter<Face>> face) {
    const FontId id = face->GetId();
    faces_[id].reset(face.release());
    order_.push_back(id);
    nextId_ = std::max(nextId_, id + 1);
}

bool FontService::AddFace(FontDataPtr data, uint32_t faceIndex, SdfMode sdf, FontId id,
                          uint32_t wantedFlags) {
    ScalablePtr face = MakeFace(data, faceIndex, sdf, id);
    if (!face) return false;
    if (wantedFlags != kAnyStyle && face->GetInstanceCount() > 0) {
        const uint32_t instance = face->FindInstance(wantedFlags);
        if (instance != faceIndex) {
            if (ScalablePtr better = MakeFace(std::move(data), instance, sdf, id)) face = std::move(better);
        }
    }
    Keep(std::move(face));
    return true;
}

void FontService::AddInstances(const FontDataPtr& data, uint32_t faceIndex, SdfMode sdf) {
    const auto& face = static_cast<const ScalableFace&>(*faces_.find(order_.back())->second);
    const uint32_t count = std::min(face.GetInstanceCount(), kMaxInstances);
    for (uint32_t instance = 1; instance <= count; ++instance)
        AddFace(data, faceIndex | instance << 16, sdf, nextId_, kAnyStyle);
}

FontId FontService::LoadFace(IStreamReader* stream, uint32_t faceIndex, SdfMode sdf, uint32_t wantedFlags) {
    Vector<uint8_t> bytes;
    if (!ReadAll(stream, &bytes)) return kNoId;
    std::lock_guard lock(mutex_);
    const FontId id = nextId_;
    return AddFace(ShareData(MakeFontData(std::move(bytes))), faceIndex, sdf, id, wantedFlags) ? id : kNoId;
}

bool FontService::LoadFaceAs(FontId id, const void* data, size_t size, uint32_t faceIndex, SdfMode sdf) {
    const auto* begin = static_cast<const uint8_t*>(data);
    std::lock_guard lock(mutex_);
    if (!IsFree(id)) return false;
    return AddFace(ShareData(MakeFontData(Vector<uint8_t>(begin, begin + size))), faceIndex, sdf, id,
                   kAnyStyle);
}

bool FontService::RegisterBitmapFontAs(FontId id, std::string_view table,
                                       const BitmapFontDescription& description) {
    std::lock_guard lock(mutex_);
    return IsFree(id) && AddBitmapFace(id, table, description);
}

FontId FontService::FindFont(const char* family, uint32_t flags) {
    const FontId id = FindLoaded(family, flags);
    return id == kNoId && LoadSystemFonts() ? FindLoaded(family, flags) : id;
}

// System fonts stand before all others in the order, so that a face which a page brings under the same name
// wins.
bool FontService::LoadSystemFonts() {
    std::lock_guard lock(mutex_);
    const Vector<FontId> loaded = std::move(order_);
    order_.clear();
    const bool opened = system_.Open([this](StreamPtr reader) {
        FontDataPtr data = MakeFontData(std::move(reader));
        if (!data) return;
        data = ShareData(std::move(data));
        uint32_t count = 1;
        for (uint32_t face = 0; face < count; ++face) {
            if (!AddFace(data, face, SdfMode::WhenLarge, nextId_, kAnyStyle)) break;
            count = static_cast<const ScalableFace&>(*faces_.find(order_.back())->second).GetFaceCount();
            AddInstances(data, face, SdfMode::WhenLarge);
        }
    });
    order_.insert(order_.end(), loaded.begin(), loaded.end());
    return opened;
}

FontId FontService::FindLoaded(const char* family, uint32_t flags) const {
    std::shared_lock lock(mutex_);
    for (auto id = order_.rbegin(); family && id != order_.rend(); ++id) {
        const FontFace& face = *faces_.find(*id)->second;
        // The question knows one style bit; an oblique face answers to it as well.
        uint32_t faceFlags = face.GetFlags();
        if (faceFlags & kFontOblique) faceFlags = (faceFlags & ~uint32_t(kFontOblique)) | kFontItalic;
        if (faceFlags == flags && EqualFamily(face.GetFamilyName(), family)) return *id;
    }
    return kNoId;
}

FontFace* FontService::FindFace(FontId id) {
    std::shared_lock lock(mutex_);
    const auto found = faces_.find(id);
    return found == faces_.end() ? nullptr : found->second.get();
}

}  // namespace fresco
