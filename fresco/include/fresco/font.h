// Fonts: the service that loads faces and the objects that measure them. Both may be used from any thread;
// a font object is read-only after loading and lives as long as the service.
#pragma once
#include <fresco/paint.h>
#include <fresco/stream_reader.h>
#include <cstddef>

namespace fresco {

// The flag word of a face. No weight bit means weight 400.
enum FontFlags : uint32_t {
    kFontItalic = 0x1,
    kFontOblique = 0x2,
    kFontWeight100 = 0x800,
    kFontWeight200 = 0x40,
    kFontWeight300 = 0x80,
    kFontWeight500 = 0x100,
    kFontWeight600 = 0x200,
    kFontWeight700 = 0x8,
    kFontWeight800 = 0x20,
    kFontWeight900 = 0x4,
};

enum class SdfMode : uint32_t {
    Always = 0,
    WhenLarge = 1,  // a back end may switch to distance fields where it pays
    Never = 2,
};

// In pixels at the asked size, y downward: ascent is negative, descent positive.
struct FontMetrics {
    float ascent = 0, descent = 0, lineGap = 0;
    float underlinePosition = 0, underlineThickness = 0;  // position of the line's top edge, downward
    float xHeight = 0, capHeight = 0;
};

enum class TextDirection : uint32_t { LeftToRight = 0, RightToLeft = 1 };

struct ShapeRequest {
    const uint32_t* codePoints = nullptr;
    size_t count = 0;
    float size = 12;
    TextDirection direction = TextDirection::LeftToRight;
    uint32_t script = 0;             // ISO 15924 tag, first letter in the high byte; 0: guess from the text
    const char* language = nullptr;  // BCP 47; null: none
    // Text around the run, for joining; they count toward `context` only.
    const uint32_t* context = nullptr;  // the array that holds the run, or null
    size_t contextCount = 0;
    size_t contextOffset = 0;  // of the run in `context`
};

struct ShapedGlyph {
    uint32_t index = 0;
    uint32_t cluster = 0;  // index of the first code point that the glyph stands for
    float advance = 0;
    float offsetX = 0, offsetY = 0;  // y downward
};

// Receives the result of a shaping in visual order, left to right.
class IShapeSink {
  public:
    virtual void OnGlyphs(const ShapedGlyph* glyphs, size_t count) = 0;

  protected:
    ~IShapeSink() = default;
};

class IFont {
  public:
    virtual uint32_t GetFlags() const = 0;
    virtual const char* GetFamilyName() const = 0;
    // 0 for what the face does not have.
    virtual void GetGlyphIndices(const uint32_t* codePoints, size_t count, uint32_t* glyphs) const = 0;
    virtual FontMetrics GetMetrics(float size) const = 0;
    // False, with all advances 0, when the size or a glyph is not valid.
    virtual bool GetAdvances(const uint32_t* glyphs, size_t count, float size, float* advances) const = 0;
    // False when there is nothing to give to the sink.
    // Runs of mixed scripts are shaped script by script. Results are kept by the text of the run.
    virtual bool Shape(const ShapeRequest& request, IShapeSink& sink) const = 0;
    virtual void MarkAsUserBitmapFont() = 0;
    // Loads the outlines of the glyphs, so that a later draw need not.
    virtual void PreloadGlyphs(const uint32_t* codePoints, size_t count) const = 0;
    // The same for the glyphs that shaping makes of a text.
    virtual void PreloadText(const char* utf8, size_t length) const = 0;
    virtual FontId GetId() const = 0;

  protected:
    ~IFont() = default;
};

// RGBA8, premultiplied.
struct BitmapFontImage {
    const void* pixels = nullptr;
    uint32_t width = 0, height = 0;
    uint32_t rowPitch = 0;  // bytes
};

// A font of pictures. Everything is copied. Its glyphs are multiplied by the colour of the text: white
// pictures take that colour, others show as they are in white text.
struct BitmapFontDescription {
    const char* family = nullptr;
    uint32_t flags = 0;
    const BitmapFontImage* images = nullptr;  // the pages that the glyph table points into
    uint32_t imageCount = 0;
};

// What IFontService::Configure takes the address of. Read during the call.
struct FontServiceConfiguration {
    uint32_t structSize = sizeof(FontServiceConfiguration);
    // BCP 47: the language of text that does not tell its own; it chooses between regional forms of
    // characters that the same code stands for. Null: as it was; empty: none.
    const char* language = nullptr;
    // Glyphs of shaped text that each face keeps. 0: as it was (32,768 at the start).
    uint32_t keptGlyphs = 0;
};

// For LoadFace: any instance will do.
inline constexpr uint32_t kAnyStyle = 0xFFFFFFFF;

class IFontService {
  public:
    virtual ~IFontService() = default;
    // The address of a FontServiceConfiguration; null does nothing. Holds for text that is shaped afterwards.
    virtual void Configure(void* argument) = 0;
    // 0 when the stream is no font. The reader stays the caller's.
    virtual uint32_t GetFaceCount(IStreamReader* stream) = 0;
    // kNoId when the stream or the face is not usable. The stream is read to its end and not kept. A variable
    // font shows the named instance in the high half of the index (from 1), or the one that comes nearest to
    // the wanted flag word.
    virtual FontId LoadFace(IStreamReader* stream, uint32_t faceIndex, SdfMode sdf,
                            uint32_t wantedFlags = kAnyStyle) = 0;
    // The stream holds the glyph table in the text form of AngelCode's BMFont. kNoId when it is not usable.
    virtual FontId RegisterBitmapFont(IStreamReader* stream, const BitmapFontDescription& description) = 0;
    // Exact match of the flag word; family names compare without regard to ASCII case. The face that was
    // loaded last wins. kNoId when absent.
    virtual FontId FindFont(const char* family, uint32_t flags) = 0;
    // Null when absent.
    virtual IFont* GetFont(FontId id) = 0;
};

}  // namespace fresco
