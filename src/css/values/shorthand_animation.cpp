// Shorthands of lists: animation, transition. Every longhand list gets one entry per item of the shorthand.
#include <optional>

#include "css/values/number_parser.h"
#include "css/values/shorthands.h"
#include "css/values/value_parsers.h"

namespace qorvex::css {

namespace {

// Fills an empty slot with the word if `read` accepts it; a slot is filled once.
template <class T, class Reader>
bool Fill(std::optional<T>& slot, std::string_view word, Reader&& read) {
    if (slot) return false;
    T value{};
    if (!read(word, value)) return false;
    slot = std::move(value);
    return true;
}

bool ReadTime(std::string_view word, Time& out) {
    return ParseTime(word, out.seconds);
}
bool ReadDuration(std::string_view word, Time& out) {
    return ReadTime(word, out) && out.seconds >= 0;
}
constexpr auto kParse = [](std::string_view word, auto& out) { return Parse(word, out); };
constexpr auto kKeyword = [](std::string_view word, auto& out) { return ParseKeyword(word, out); };

bool ReadName(std::string_view word, CssString& out) {
    AnimationName names;
    if (!Parse(word, names)) return false;
    if (!names.empty()) out = names[0];
    return names.size() <= 1;
}

bool ReadTarget(std::string_view word, TransitionTarget& out) {
    TransitionProperty targets;
    if (!Parse(word, targets) || targets.size() > 1) return false;
    out.kind = TransitionTargetKind::None;
    if (!targets.empty()) out = targets[0];
    return true;
}

// Reads each word of an item; false when one fits nowhere or there is none.
template <class Take>
bool ReadItem(std::string_view item, Take&& take) {
    WordReader words(item);
    std::string_view word;
    bool any = false;
    while (words.Next(word)) {
        if (!take(word)) return false;
        any = true;
    }
    return any;
}

}  // namespace

bool ExpandAnimation(std::string_view text, ShorthandOutput& out) {
    AnimationName names;
    TimeList durations, delays;
    AnimationIterationCount counts;
    AnimationFillMode fills;
    AnimationDirection directions;
    TimingFunctionList timings;
    AnimationPlayState states;
    ListReader list(text);
    std::string_view item;
    while (list.Next(item)) {
        std::optional<CssString> name;
        std::optional<Time> duration, delay;
        std::optional<IterationCount> count;
        std::optional<AnimationFillModeItem> fill;
        std::optional<AnimationDirectionItem> direction;
        std::optional<TimingFunction> timing;
        std::optional<AnimationPlayStateItem> state;
        bool read = ReadItem(item, [&](std::string_view word) {
            return Fill(duration, word, ReadDuration) || Fill(count, word, kParse) ||
                   Fill(delay, word, ReadTime) || Fill(fill, word, kKeyword) ||
                   Fill(direction, word, kKeyword) || Fill(timing, word, kParse) ||
                   Fill(state, word, kKeyword) || Fill(name, word, ReadName);
        });
        if (!read) return false;
        names.items.push_back(name.value_or(CssString()));
        durations.items.push_back(duration.value_or(Time()));
        counts.items.push_back(count.value_or(IterationCount()));
        delays.items.push_back(delay.value_or(Time()));
        fills.items.push_back(fill.value_or(AnimationFillModeItem::None));
        directions.items.push_back(direction.value_or(AnimationDirectionItem::Normal));
        timings.items.push_back(timing.value_or(TimingFunction()));
        states.items.push_back(state.value_or(AnimationPlayStateItem::Running));
    }
    // "none" alone is the empty list, as in the longhand.
    if (names.size() == 1 && names[0].empty()) names.items.clear();
    out.Add(Declaration::Make<PropertyId::AnimationName>(std::move(names)));
    out.Add(Declaration::Make<PropertyId::AnimationDuration>(std::move(durations)));
    out.Add(Declaration::Make<PropertyId::AnimationIterationCount>(std::move(counts)));
    out.Add(Declaration::Make<PropertyId::AnimationDelay>(std::move(delays)));
    out.Add(Declaration::Make<PropertyId::AnimationFillMode>(std::move(fills)));
    out.Add(Declaration::Make<PropertyId::AnimationDirection>(std::move(directions)));
    out.Add(Declaration::Make<PropertyId::AnimationTimingFunction>(std::move(timings)));
    out.Add(Declaration::Make<PropertyId::AnimationPlayState>(std::move(states)));
    return true;
}

bool ExpandTransition(std::string_view text, ShorthandOutput& out) {
    TransitionProperty targets;
    TimeList durations, delays;
    TimingFunctionList timings;
    ListReader list(text);
    std::string_view item;
    while (list.Next(item)) {
        std::optional<TransitionTarget> target;
        std::optional<Time> duration, delay;
        std::optional<TimingFunction> timing;
        bool read = ReadItem(item, [&](std::string_view word) {
            return Fill(duration, word, ReadDuration) || Fill(delay, word, ReadTime) ||
                   Fill(timing, word, kParse) || Fill(target, word, ReadTarget);
        });
        if (!read) return false;
        targets.items.push_back(target.value_or(TransitionTarget()));
        durations.items.push_back(duration.value_or(Time()));
        delays.items.push_back(delay.value_or(Time()));
        timings.items.push_back(timing.value_or(TimingFunction()));
    }
    // "none" alone is the empty list, as in the longhand.
    if (targets.size() == 1 && targets[0].kind == TransitionTargetKind::None) targets.items.clear();
    out.Add(Declaration::Make<PropertyId::TransitionProperty>(std::move(targets)));
    out.Add(Declaration::Make<PropertyId::TransitionDuration>(std::move(durations)));
    out.Add(Declaration::Make<PropertyId::TransitionDelay>(std::move(delays)));
    out.Add(Declaration::Make<PropertyId::TransitionTimingFunction>(std::move(timings)));
    return true;
}

}  // namespace qorvex::css
