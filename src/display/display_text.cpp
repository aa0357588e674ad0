#include "display/display_text.h"

#include <qorvex/text_services.h>

#include <cmath>

#include "core/logging/log.h"
#include "display/paint_context.h"
#include "layout/layout_store.h"
#include "layout/text/text_alignment.h"
#include "layout/text/text_layout.h"

namespace qorvex::dsp {

using layout::Near;

namespace {

// Glyphs may reach this part of the font size beyond their line and their advance.
constexpr float kOverhang = 0.5f;

bool SameExtent(float a, float b) {
    return Near(a, b) || (std::isnan(a) && std::isnan(b));
}

}  // namespace

void DisplayText::DestroyIterator::operator()(i18n::IBreakIterator* iterator) const {
    iterator->Destroy();
}

DisplayText::DisplayText(layout::NodeLinkPtr link, IInternationalizationManager* i18n)
    : IDisplayElement(kMeasures | kIsText), link_(std::move(link)) {
    if (i18n != nullptr) iterator_.reset(i18n->CreateBreakIterator(i18n::BreakIteratorBoundary::Line));
}

DisplayText::~DisplayText() = default;

void DisplayText::SetText(std::string_view text) {
    if (text == text_.view()) return;
    if (iterator_) iterator_->ClearText();
    text_ = text;
    if (iterator_) iterator_->SetText(text_.data(), static_cast<unsigned>(text_.size()));
    laidOut_ = false;
}

uint32_t DisplayText::TextLength() const {
    return static_cast<uint32_t>(text_.size());
}

bool DisplayText::Holds(const Parameters& wanted) const {
    if (!laidOut_ || !SameTextStyle(wanted.style, laid_.style)) return false;
    if (!Near(wanted.firstLineOffset, laid_.firstLineOffset) || wanted.inFlow != laid_.inFlow) return false;
    const bool fits = wanted.style.fit != css::FontFitModeType::None;
    if (!fits && !Near(wanted.style.usedSize, laid_.style.usedSize)) return false;
    if (fits && !SameExtent(wanted.height, laid_.height)) return false;
    if (SameExtent(wanted.width, laid_.width)) return true;
    // Lines that fit a narrower width without a break are the same in a wider one, and the other way round.
    const bool followsWidth = fits || wanted.style.align != css::TextAlignType::Left ||
                              wanted.style.overflow != css::TextOverflowMode::Clip ||
                              wanted.firstLineOffset > 0;
    return !followsWidth && !info_.wrapped && !(wanted.width < info_.width);
}

bool DisplayText::EnsureLayout(const layout::LayoutNode& node, const layout::TextServices& services,
                               const Parameters& wanted) {
    if (services.fonts == nullptr) return false;
    if (Holds(wanted)) return true;
    if (!LayoutText({text_.view(), wanted.style, wanted.width, wanted.height, *services.fonts,
                     iterator_.get(), services.i18n, wanted.firstLineOffset, true, wanted.inFlow},
                    info_)) {
        LogDebug("Measuring text without typeface");
        info_.Clear();
        laidOut_ = false;
        return false;
    }
    laid_ = wanted;
    laidOut_ = unpublished_ = true;
    SetInk(std::ceil(info_.usedSize * kOverhang + node.style.text->computedStrokeWidth),
           {std::ceil(info_.width), std::ceil(info_.height)});
    return true;
}

void DisplayText::Measure(layout::LayoutHandle& handle, float availableWidth, float availableHeight,
                          MeasureMode widthMode, MeasureMode heightMode, layout::Size& out) {
    if (widthMode == MeasureMode::Undefined) availableWidth = NAN;
    if (heightMode == MeasureMode::Undefined) availableHeight = NAN;
    out = MeasureFor(handle, availableWidth, availableHeight);
    Remember({availableWidth, availableHeight, out});
}

layout::Size DisplayText::MeasureFor(layout::LayoutHandle& handle, float availableWidth,
                                     float availableHeight) {
    placed_.clear();
    justified_.reset();
    const css::TextLayoutStyle* group = handle.node().style.text.get();
    if (group == nullptr) return {};
    const layout::TextServices& services = handle.store().text;
    Parameters wanted{layout::MakeTextStyle(*group), availableWidth, availableHeight};
    wanted.style.complexText = services.complexText;
    if (!EnsureLayout(handle.node(), services, wanted)) return {};
    return {std::ceil(info_.width), std::ceil(info_.height)};
}

void DisplayText::Remember(const Answer& answer) {
    for (Answer& known : answers_) {
        if (!SameExtent(known.width, answer.width) || !SameExtent(known.height, answer.height)) continue;
        known = answer;
        return;
    }
    tooManyAnswers_ = tooManyAnswers_ || answers_.size() == kMostAnswers;
    if (!tooManyAnswers_) answers_.push_back(answer);
}

bool DisplayText::KeepsSize(layout::LayoutHandle& handle) {
    bool keeps = !tooManyAnswers_ && !answers_.empty();
    for (size_t i = 0; keeps && i < answers_.size(); ++i) {
        const layout::Size size = MeasureFor(handle, answers_[i].width, answers_[i].height);
        keeps = size.width == answers_[i].size.width && size.height == answers_[i].size.height;
    }
    if (!keeps) {
        answers_.clear();
        tooManyAnswers_ = false;
    }
    return keeps;
}

const layout::TextInfo* DisplayText::LayoutInline(layout::LayoutHandle& handle,
                                                  const InlineTextRequest& request) {
    const css::TextLayoutStyle* group = handle.node().style.text.get();
    if (group == nullptr) return nullptr;
    const layout::TextServices& services = handle.store().text;
    Parameters wanted{layout::MakeTextStyle(*group), request.width, NAN, request.firstLineOffset, true};
    // Both belong to the paragraph, which aligns whole lines and fits all of its text at once.
    wanted.style.align = css::TextAlignType::Left;
    wanted.style.fit = css::FontFitModeType::None;
    wanted.style.complexText = services.complexText;
    wanted.style.usedSize = wanted.style.fontSize * request.scale;
    return EnsureLayout(handle.node(), services, wanted) ? &info_ : nullptr;
}

void DisplayText::PlaceLines(const layout::LinePlacement* lines, size_t count) {
    placed_.assign(lines, lines + count);
    unpublished_ = true;
    justified_.reset();
    for (size_t i = 0; i < count; ++i) {
        if (lines[i].gap <= 0) continue;
        if (!justified_) justified_ = MakeUnique<layout::TextInfo, MemoryTag::LayoutData>(info_);
        SpreadLine(*justified_, justified_->lines[i], lines[i]);
    }
}

void DisplayText::OffsetLine(uint32_t lineIndex, float offset, uint8_t alignment) {
    using css::TextAlignType;
    if (lineIndex >= placed_.size()) return;
    const auto align = static_cast<TextAlignType>(alignment);
    const float part = align == TextAlignType::Center ? 0.5f : align == TextAlignType::Right ? 1.0f : 0.0f;
    placed_[lineIndex].x += offset * part;
}

void DisplayText::GrowLastLine(float amount) {
    if (info_.lines.empty()) return;
    info_.lines.back().height += amount;
    info_.height += amount;
}

void DisplayText::Publish(PaintContext& context) {
    if (!unpublished_ || !link_ || context.family == nullptr) return;
    unpublished_ = false;
    auto style = MakeRef<layout::TextFontStyle>();
    for (const uint32_t font : laid_.style.typefaces)
        if (style->font == css::kNoTypeface) style->font = font;
    style->size = info_.usedSize;
    style->letterSpacing = laid_.style.letterSpacing;
    if (!info_.lines.empty()) {
        style->lineHeight = info_.lines[0].height;
        style->baseline = info_.lines[0].baseline;
    }
    using layout::DOMTaskKind;
    if (!publishedStyle_ || !publishedStyle_->Same(*style)) {
        publishedStyle_ = style;
        SendToDOM(*context.family, DOMTaskKind::UpdateFontStyleDataInDOM, link_, std::move(style),
                  layout::Delivery::ThroughChannel);
    }
    auto positions = MakeRef<layout::TextPositions>();
    ComputeTextPositions(Shown(), text_.view(), laid_.style.whiteSpace, Placements(), *positions);
    SendToDOM(*context.family, DOMTaskKind::UpdateTextPositionsInDOM, link_, std::move(positions),
              layout::Delivery::ThroughChannel);
}

}  // namespace qorvex::dsp
