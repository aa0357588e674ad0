#include "support/text_page.h"

#include <cmath>

#include "css/parser/convert.h"
#include "display/display_paragraph.h"
#include "display/display_text.h"
#include "display/page_elements.h"
#include "display/record_rendering.h"
#include "display/visual_style.h"
#include "host/icu_text_services.h"
#include "layout/layout_store.h"
#include "layout/perform_layout.h"
#include "layout/text/text_positions.h"
#include "support/engine.h"
#include "support/memory_file.h"
#include "tests/support/style_text.h"

namespace qorvex::fuzz {

namespace {

constexpr char kSheet[] = "@font-face { font-family: F; font-weight: 700; src: url(game://fonts/f.ttf) }";

host::IcuInternationalization& TextServices() {
    static auto* services = new host::IcuInternationalization;
    return *services;
}

void CheckText(const dsp::DisplayText& text, css::WhiteSpaceMode white_space) {
    if (text.Info() == nullptr) return;
    const layout::TextInfo& info = *text.Info();
    Require(std::isfinite(info.width) && std::isfinite(info.height), "a text whose size is no number");
    for (const fresco::Glyph& glyph : info.glyphs)
        Require(std::isfinite(glyph.x) && std::isfinite(glyph.y), "a glyph whose place is no number");
    for (const layout::TextRun& run : info.runs)
        Require(run.firstGlyph + run.glyphCount <= info.glyphs.size(), "a run of glyphs that are not there");
    layout::TextPositions positions;
    ComputeTextPositions(info, text.Text(), white_space, nullptr, positions);
    for (const float x : positions.x)
        Require(std::isfinite(x), "a character whose place is no number");
}

}  // namespace

DefaultStyles::DefaultStyles() {
    css::CreateDefaultStyles();
}
DefaultStyles::~DefaultStyles() {
    css::DestroyDefaultStyles();
}

TaskPtr OneFontFile::RequestFont(const URL&, Callback done) {
    done(new MemoryFile(data_, size_));
    return MakeTask("FontRequested", [] {});
}

TextPage::TextPage(Scene& scene, const uint8_t* font, size_t size) : scene_(scene), loader_(font, size) {
    fresco::IFontService& service = *scene.library().GetFontService();
    fonts_.reset(new layout::FontManager({service, {1, &tasks_}, loader_, strings_, {nullptr, nullptr}, 2}));
    const css::StylesheetPtr sheet = css::MakeStylesheet(kSheet, "", strings_);
    for (const css::FontFace& face : sheet->fontFaces)
        fonts_->AddFontFace(face);
    // A description that leaves all open loads every face, as distance fields.
    fonts_->AddFontDescription({}, URL("game://fonts/f.ttc"), 1);
    tasks_.Run(TaskChannels::Resources, false, nullptr, kAllTaskFamilies);
    fonts_->RunMainTasks();

    css::FontFamily family;
    family.items.push_back(css::CssString("F"));
    typefaces_.resize(2);
    fonts_->ResolveTypefaces(family, css::FontStyle::Italic, 7, {}, typefaces_[0]);
    const fresco::FontId fallback = typefaces_[0].back();
    for (fresco::FontId id = fallback + 1; typefaces_[1].size() < 3 && service.GetFont(id); ++id)
        typefaces_[1].push_back(id);
    typefaces_[1].push_back(fallback);

    tree_.SetTextServices({&service, &TextServices()});
    layout::LayoutHandle* root =
        Keep(tree_.CreateRoot({css::DefaultStyles(), MakeRef<dsp::DisplayHTML>(), nullptr, {}, false}));
    body_ = Keep(
        tree_.AddChild(*root, 0, {css::DefaultStyles(), MakeRef<dsp::DisplayBody>(), nullptr, {}, false}));
}

TextPage::~TextPage() = default;

layout::LayoutHandle* TextPage::Keep(layout::HandlePtr handle) {
    handles_.push_back(std::move(handle));
    return handles_.back().get();
}

layout::LayoutHandle& TextPage::AddBox(dsp::DisplayElementPtr display) {
    css::LayoutStyleRefs& style = kept_styles_.emplace_back(css::DefaultStyles());
    Require(test::ApplyDeclarations(style, "width: 60px; max-height: 40px"), "a style of the target's own");
    const auto index = static_cast<uint32_t>(body_->data().Children().size());
    return *Keep(tree_.AddChild(*body_, index, {style, std::move(display), nullptr, {}, false}));
}

void TextPage::Fill(layout::LayoutHandle& box, std::string_view text, std::string_view declarations) {
    css::LayoutStyleRefs& style = kept_styles_.emplace_back(css::DefaultStyles());
    Require(test::ApplyDeclarations(style, declarations), "a style of the target's own");
    css::TextLayoutStyle& group = style.Mutable<css::TextLayoutStyle>();
    group.typefaces = typefaces_[handles_.size() % 2];
    if (text.size() % 3 == 0) group.computedLetterSpacing = 1.5f;
    if (text.size() % 5 == 0) group.computedStrokeWidth = 1;
    auto display = MakeRef<dsp::DisplayText>(&TextServices());
    display->SetText(text);
    const auto index = static_cast<uint32_t>(box.data().Children().size());
    Keep(tree_.AddChild(box, index, {style, std::move(display), nullptr, {}, false}));
}

void TextPage::AddText(std::string_view text, std::string_view style) {
    Fill(AddBox(MakeRef<dsp::Box>()), text, style);
}

void TextPage::AddParagraph(std::string_view text) {
    layout::LayoutHandle& paragraph = AddBox(MakeRef<dsp::DisplayParagraph>());
    Fill(paragraph, text, "");
    Fill(paragraph, text, "font-size: 25px");
}

void TextPage::LayOut(layout::LayoutUpdateData& update) {
    update.bodyDisplay = body_->data().style->layout->display;
    tree_.Commit(update, nullptr, nullptr);
    layout::LayoutPass pass{update, tree_.Root(), kSide, kSide, dirty_};
    layout::PerformLayout(pass);
    dsp::RecalculateVisualStyle(pass);
    layout::SyncTrees(update);
    for (const layout::HandlePtr& handle : handles_) {
        const layout::LayoutResult& box = handle->data().result;
        Require(std::isfinite(box.left) && std::isfinite(box.top) && std::isfinite(box.width) &&
                    std::isfinite(box.height),
                "a box whose sides are no numbers");
        const dsp::IDisplayElement* display = handle->Display();
        if (display->Has(dsp::IDisplayElement::kIsText))
            CheckText(static_cast<const dsp::DisplayText&>(*display), handle->data().style->text->whiteSpace);
    }
}

void TextPage::Draw(layout::LayoutUpdateData& update) {
    layout::LayoutPass pass{update, tree_.Root(), kSide, kSide, dirty_};
    dirty_.Add(layout::MakeRect(0, 0, kSide, kSide));
    dsp::FrameRecord record = dsp::RecordRendering(pass, {caches_});
    scene_.Draw({record.resourceBuffers.data(), record.resourceBuffers.size()},
                {record.buffers.data(), record.buffers.size()});
}

void TextPage::Show() {
    const auto update = MakeRef<layout::LayoutUpdateData>();
    LayOut(*update);
    Draw(*update);
}

}  // namespace qorvex::fuzz
