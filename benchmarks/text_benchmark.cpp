// Text layout against the least that it could be: shaping alone, and a sum of advances that are there
// already.
#include <benchmark/benchmark.h>
#include <fresco/rendering_library.h>
#include <hb.h>

#include <cmath>
#include <fstream>
#include <iterator>
#include <memory>
#include <string>
#include <vector>

#include "core/memory/temp_allocator.h"
#include "host/icu_text_services.h"
#include "layout/fonts/memory_stream.h"
#include "layout/text/text_layout.h"

namespace {

using namespace qorvex;

constexpr char kFontFile[] = "/usr/share/fonts/truetype/dejavu/DejaVuSans.ttf";
constexpr float kSize = 16;
constexpr float kWidth = 400;

std::string ReadFont() {
    std::ifstream file(kFontFile, std::ios::binary);
    return std::string(std::istreambuf_iterator<char>(file), {});
}

class Texts {
  public:
    Texts() : bytes_(ReadFont()), library_(fresco::CreateNullRenderingLibrary({})) {
        layout::MemoryStream stream(reinterpret_cast<const unsigned char*>(bytes_.data()), bytes_.size());
        style_.typefaces.push_back(Service().LoadFace(&stream, 0, fresco::SdfMode::Never));
        style_.fontSize = style_.usedSize = kSize;
        iterator_ = services_.CreateBreakIterator(i18n::BreakIteratorBoundary::Line);
    }
    ~Texts() {
        iterator_->Destroy();
        library_->Destroy();
    }

    void LayOut(const std::string& text) {
        iterator_->SetText(text.data(), static_cast<unsigned>(text.size()));
        const bool done =
            layout::LayoutText({text, style_, kWidth, NAN, Service(), iterator_, &services_}, info_);
        benchmark::DoNotOptimize(done);
    }
    fresco::IFontService& Service() { return *library_->GetFontService(); }
    const fresco::IFont& Font() { return *Service().GetFont(style_.typefaces[0]); }
    const std::string& FontBytes() const { return bytes_; }
    size_t Lines() const { return info_.lines.size(); }

  private:
    const std::string bytes_;
    fresco::IRenderingLibrary* library_;
    layout::TextStyle style_;
    layout::TextInfo info_;
    host::IcuInternationalization services_;
    i18n::IBreakIterator* iterator_;
};

const char* const kArabicWords[] = {"تتداخل", "الكلمات", "العربية", "في", "السطر",  "نفسه", "مع",
                                    "أرقام",  "كثيرة",   "وحروف",   "من", "اليمين", "إلى",  "اليسار"};

// More different paragraphs than the shaping cache holds, so that each is shaped anew when its turn comes.
std::vector<std::string> Paragraphs() {
    std::vector<std::string> paragraphs;
    uint32_t seed = 1;
    for (int i = 0; i < 400; ++i) {
        std::string text;
        for (int word = 0; word < 30; ++word) {
            seed = seed * 1664525 + 1013904223;
            if (word > 0) text += ' ';
            text += kArabicWords[(seed >> 16) % std::size(kArabicWords)];
        }
        paragraphs.push_back(text);
    }
    return paragraphs;
}

void LayoutComplex(benchmark::State& state) {
    Texts texts;
    const std::vector<std::string> paragraphs = Paragraphs();
    size_t next = 0;
    for (auto _ : state)
        texts.LayOut(paragraphs[next++ % paragraphs.size()]);
    state.counters["target"] = 1.4;
    state.counters["lines"] = static_cast<double>(texts.Lines());
}
BENCHMARK(LayoutComplex)->Name("text_layout_complex");

void ShapeAlone(benchmark::State& state) {
    const std::string bytes = ReadFont();
    hb_blob_t* blob = hb_blob_create(bytes.data(), static_cast<unsigned>(bytes.size()),
                                     HB_MEMORY_MODE_READONLY, nullptr, nullptr);
    hb_face_t* face = hb_face_create(blob, 0);
    hb_font_t* font = hb_font_create(face);
    hb_buffer_t* buffer = hb_buffer_create();
    const std::vector<std::string> paragraphs = Paragraphs();
    size_t next = 0;
    for (auto _ : state) {
        const std::string& text = paragraphs[next++ % paragraphs.size()];
        hb_buffer_clear_contents(buffer);
        hb_buffer_add_utf8(buffer, text.data(), static_cast<int>(text.size()), 0, -1);
        hb_buffer_set_direction(buffer, HB_DIRECTION_RTL);
        hb_buffer_guess_segment_properties(buffer);
        hb_shape(font, buffer, nullptr, 0);
        benchmark::DoNotOptimize(hb_buffer_get_length(buffer));
    }
    hb_buffer_destroy(buffer);
    hb_font_destroy(font);
    hb_face_destroy(face);
    hb_blob_destroy(blob);
}
BENCHMARK(ShapeAlone)->Name("text_layout_complex_baseline");

std::string EnglishText() {
    std::string text;
    while (text.size() < 4000)
        text += "The quick brown fox jumps over the lazy dog, and nobody minds at all. ";
    return text;
}

void LayoutPlain(benchmark::State& state) {
    Texts texts;
    const std::string text = EnglishText();
    for (auto _ : state)
        texts.LayOut(text);
    state.counters["target"] = 3;
    state.counters["lines"] = static_cast<double>(texts.Lines());
}
BENCHMARK(LayoutPlain)->Name("text_layout_plain");

// Asks the face for one glyph and its advance after the other, as any layout must, and sums.
void SumAdvances(benchmark::State& state) {
    Texts texts;
    const std::string text = EnglishText();
    const fresco::IFont& font = texts.Font();
    for (auto _ : state) {
        float sum = 0;
        for (const char c : text) {
            const auto code = static_cast<uint32_t>(c);
            uint32_t glyph = 0;
            float advance = 0;
            font.GetGlyphIndices(&code, 1, &glyph);
            font.GetAdvances(&glyph, 1, kSize, &advance);
            sum += advance;
        }
        benchmark::DoNotOptimize(sum);
    }
}
BENCHMARK(SumAdvances)->Name("text_layout_plain_baseline");

}  // namespace
