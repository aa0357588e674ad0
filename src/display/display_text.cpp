#include "display/display_text.h"

#include <qorvex/text_services.h>

#include <algorithm>
#include <cmath>

#include "core/logging/log.h"
#include "display/paint_context.h"
#include "layout/layout_store.h"
#include "layout/text/text_alignment.h"
#include "layout/text/text_layout.h"
#include "qsl/city_hash.h"

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

DisplayText::DisplayText(IInternationalizationManager* i18n) : IDisplayElement(kMeasures | kIsText) {
    if (i18n == nullptr) return;
    i18n::IBreakIterator* iterator = i18n->CreateBreakIterator(i18n::BreakIteratorBoundary::Line);
    if (iterator != nullptr) EnsureLines().iterator.reset(iterator);
}

DisplayText::~DisplayText() = default;

DisplayText::Lines& DisplayText::EnsureLines() {
    if (!lines_) lines_ = MakeUnique<Lines, MemoryTag::LayoutData>();
    return *lines_;
}

float DisplayText::InkOverflow() const {
    const layout::TextInfo* info = Info();
    return info ? std::ceil(info->usedSize * kOverhang) : 0;
}

layout::Size DisplayText::ContentSize() const {
    const layout::TextInfo* info = Info();
    return info ? layout::Size{std::ceil(info->width), std::ceil(info->height)} : layout::Size();
}

void DisplayText::SetText(std::string_view text) {
    if (text == text_.view()) return;
    i18n::IBreakIterator* iterator = Iterator();
    if (iterator) iterator->ClearText();
    text_ = text;
    if (iterator) iterator->SetText(text_.data(), static_cast<unsigned>(text_.size()));
    if (lines_) lines_->valid = false;
}

uint32_t DisplayText::TextLength() const {
    return static_cast<uint32_t>(text_.size());
}

layout::TextStyle DisplayText::MakeStyle(const Parameters& parameters) {
    layout::TextStyle style = layout::MakeTextStyle(*parameters.style);
    style.usedSize = parameters.usedSize;
    style.complexText = parameters.complexText;
    if (parameters.inFlow) {
        // Both belong to the paragraph, which aligns whole lines and fits all of its text at once.
        style.align = css::TextAlignType::Left;
        style.fit = css::FontFitModeType::None;
    }
    return style;
}

bool DisplayText::Holds(const Parameters& wanted) const {
    if (!lines_ || !lines_->valid) return false;
    const Parameters& laid = lines_->parameters;
    if (wanted.inFlow != laid.inFlow || wanted.complexText != laid.complexText || wanted.base != laid.base ||
        wanted.levels != laid.levels)
        return false;
    if (!(wanted.style == laid.style) && !SameTextStyle(MakeStyle(wanted), MakeStyle(laid))) return false;
    if (!Near(wanted.firstLineOffset, laid.firstLineOffset)) return false;
    const css::TextLayoutStyle& style = *wanted.style;
    const bool fits = !wanted.inFlow && style.fontFitMode != css::FontFitModeType::None;
    if (!fits && !Near(wanted.usedSize, laid.usedSize)) return false;
    if (fits && !SameExtent(wanted.height, laid.height)) return false;
    if (SameExtent(wanted.width, laid.width)) return true;
    // Lines that fit a narrower width without a break are the same in a wider one, and the other way round.
    const bool aligned = !wanted.inFlow && style.textAlign != css::TextAlignType::Left;
    const bool followsWidth =
        fits || aligned || style.textOverflow != css::TextOverflowMode::Clip || wanted.firstLineOffset > 0;
    return !followsWidth && !lines_->info.wrapped && !(wanted.width < lines_->info.width);
}

bool DisplayText::EnsureLayout(const layout::TextServices& services, const Parameters& wanted,
                               const uint8_t* levels) {
    if (services.fonts == nullptr) return false;
    if (Holds(wanted)) return true;
    layout::TextInfo& info = EnsureLines().info;
    const layout::TextStyle style = MakeStyle(wanted);
    lines_->valid =
        LayoutText({text_.view(), style, wanted.width, wanted.height, *services.fonts, Iterator(),
                    services.i18n, wanted.firstLineOffset, true, wanted.inFlow, wanted.base, levels},
                   info);
    if (!lines_->valid) {
        LogDebug("Measuring text without typeface");
        info.Clear();
        return false;
    }
    lines_->parameters = wanted;
    lines_->unpublished = true;
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
    if (lines_) {
        lines_->placed.clear();
        lines_->arranged.reset();
    }
    const auto& style = handle.node().style->text;
    if (!style) return {};
    const layout::TextServices& services = handle.store().text;
    if (!EnsureLayout(services, {style, style->computedFontSize, availableWidth, availableHeight, 0, false,
                                 services.complexText}))
        return {};
    return {std::ceil(lines_->info.width), std::ceil(lines_->info.height)};
}

void DisplayText::Remember(const Answer& answer) {
    if (!lines_) return;
    for (Answer& known : lines_->answers) {
        if (!SameExtent(known.width, answer.width) || !SameExtent(known.height, answer.height)) continue;
        known = answer;
        return;
    }
    lines_->tooManyAnswers = lines_->tooManyAnswers || lines_->answers.size() == Lines::kMostAnswers;
    if (!lines_->tooManyAnswers) lines_->answers.push_back(answer);
}

bool DisplayText::KeepsSize(layout::LayoutHandle& handle) {
    if (!lines_) return false;
    const auto& answers = lines_->answers;
    bool keeps = !lines_->tooManyAnswers && !answers.empty();
    for (size_t i = 0; keeps && i < answers.size(); ++i) {
        const layout::Size size = MeasureFor(handle, answers[i].width, answers[i].height);
        keeps = size.width == answers[i].size.width && size.height == answers[i].size.height;
    }
    if (!keeps) {
        lines_->answers.clear();
        lines_->tooManyAnswers = false;
    }
    return keeps;
}

const layout::TextInfo* DisplayText::LayoutInline(layout::LayoutHandle& handle,
                                                  const InlineTextRequest& request) {
    const auto& style = handle.node().style->text;
    if (!style) return nullptr;
    const layout::TextServices& services = handle.store().text;
    const std::span<const uint8_t> levels = request.levels;
    const uint64_t hash =
        levels.empty() ? 0 : qsl::CityHash64({reinterpret_cast<const char*>(levels.data()), levels.size()});
    const bool done = EnsureLayout(services,
                                   {style, style->computedFontSize * request.scale, request.width, NAN,
                                    request.firstLineOffset, true, services.complexText, request.base, hash},
                                   levels.empty() ? nullptr : levels.data());
    return done ? &lines_->info : nullptr;
}

void DisplayText::PlaceLines(const layout::LinePlacement* lines, size_t count, const float* runs) {
    if (!lines_) return;
    lines_->placed.assign(lines, lines + count);
    lines_->unpublished = true;
    lines_->arranged.reset();
    const bool spreads = std::any_of(lines, lines + count, [](const auto& line) { return line.gap > 0; });
    if (!spreads && runs == nullptr) return;
    lines_->arranged = MakeUnique<layout::TextInfo, MemoryTag::LayoutData>(lines_->info);
    layout::TextInfo& arranged = *lines_->arranged;
    for (size_t i = 0; i < count; ++i) {
        layout::TextLineInfo& line = arranged.lines[i];
        if (lines[i].gap > 0) SpreadLine(arranged, line, lines[i]);
        if (runs == nullptr || line.runCount == 0 || std::isnan(runs[line.firstRun])) continue;
        line.extent = 0;
        for (uint32_t run = line.firstRun; run < line.firstRun + line.runCount; ++run) {
            arranged.runs[run].x = runs[run];
            line.extent = std::max(line.extent, runs[run] + arranged.runs[run].width);
        }
    }
}

void DisplayText::OffsetLine(uint32_t lineIndex, float offset, uint8_t alignment) {
    using css::TextAlignType;
    if (!lines_ || lineIndex >= lines_->placed.size()) return;
    const auto align = static_cast<TextAlignType>(alignment);
    const float part = align == TextAlignType::Center ? 0.5f : align == TextAlignType::Right ? 1.0f : 0.0f;
    lines_->placed[lineIndex].x += offset * part;
}

void DisplayText::GrowLastLine(float amount) {
    if (!lines_ || lines_->info.lines.empty()) return;
    lines_->info.lines.back().height += amount;
    lines_->info.height += amount;
}

void DisplayText::Publish(PaintContext& context) {
    if (!lines_->unpublished || context.family == nullptr) return;
    const layout::NodeLinkPtr link = GetLink();
    if (!link) return;
    lines_->unpublished = false;
    const layout::TextInfo& info = lines_->info;
    const css::TextLayoutStyle& group = *lines_->parameters.style;
    auto style = MakeRef<layout::TextFontStyle>();
    for (const uint32_t font : group.typefaces)
        if (style->font == css::kNoTypeface) style->font = font;
    style->size = info.usedSize;
    style->letterSpacing = group.computedLetterSpacing;
    if (!info.lines.empty()) {
        style->lineHeight = info.lines[0].height;
        style->baseline = info.lines[0].baseline;
    }
    using layout::DOMTaskKind;
    if (!lines_->publishedStyle || !lines_->publishedStyle->Same(*style)) {
        lines_->publishedStyle = style;
        SendToDOM(*context.family, DOMTaskKind::UpdateFontStyleDataInDOM, link, std::move(style),
                  layout::Delivery::ThroughChannel);
    }
    auto positions = MakeRef<layout::TextPositions>();
    ComputeTextPositions(lines_->Shown(), text_.view(), group.whiteSpace, lines_->Placements(), *positions);
    SendToDOM(*context.family, DOMTaskKind::UpdateTextPositionsInDOM, link, std::move(positions),
              layout::Delivery::ThroughChannel);
}

}  // namespace qorvex::dsp
