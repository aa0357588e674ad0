// A page of texts in one font, which comes by the road of @font-face: laid out with the host's text services,
// recorded, and drawn on a scene.
#pragma once

#include <cstdint>
#include <deque>
#include <memory>
#include <string_view>
#include <vector>

#include "display/dirty_region.h"
#include "display/render_caches.h"
#include "layout/fonts/font_manager.h"
#include "layout/layout_tree.h"
#include "support/scene.h"

namespace qorvex::fuzz {

/// Makes the engine's default styles for its life.
class DefaultStyles {
  public:
    DefaultStyles();
    ~DefaultStyles();
};

/// Answers every request with the same file.
class OneFontFile final : public layout::IFontResourceLoader {
  public:
    OneFontFile(const uint8_t* data, size_t size) : data_(data), size_(size) {}
    TaskPtr RequestFont(const URL& url, Callback done) override;

  private:
    const uint8_t* data_;
    size_t size_;
};

class TextPage {
  public:
    TextPage(Scene& scene, const uint8_t* font, size_t size);
    ~TextPage();
    TextPage(const TextPage&) = delete;
    TextPage& operator=(const TextPage&) = delete;

    /// A box of its own for a text.
    void AddText(std::string_view text, std::string_view style);
    /// The text in two sizes that share lines.
    void AddParagraph(std::string_view text);
    /// Lays out, checks what came of it, records and draws.
    void Show();

  private:
    static constexpr uint32_t kSide = 64;

    layout::LayoutHandle* Keep(layout::HandlePtr handle);
    layout::LayoutHandle& AddBox(dsp::DisplayElementPtr display);
    void Fill(layout::LayoutHandle& box, std::string_view text, std::string_view style);
    void LayOut(layout::LayoutUpdateData& update);
    void Draw(layout::LayoutUpdateData& update);

    Scene& scene_;
    const DefaultStyles styles_;
    TaskSystem tasks_{TaskSystemSettings{}};
    StringPool strings_;
    OneFontFile loader_;
    std::unique_ptr<layout::FontManager> fonts_;
    // What the face list of a text begins with: the page's own family, or every face of the file.
    std::vector<layout::TypefaceList> typefaces_;
    std::deque<css::LayoutStyleRefs> kept_styles_;  // handles look at them
    layout::LayoutTree tree_;
    dsp::DirtyRegion dirty_;
    dsp::RenderCaches caches_;
    std::vector<layout::HandlePtr> handles_;
    layout::LayoutHandle* body_ = nullptr;
};

}  // namespace qorvex::fuzz
