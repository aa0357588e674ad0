// Text forms of the animation and transition lists.
#include "core/logging/log.h"
#include "css/values/number_parser.h"
#include "css/values/value_parsers.h"

namespace qorvex::css {

bool Parse(std::string_view text, TimeList& out) {
    return ParseList(text, out,
                     [](std::string_view item, Time& time) { return ParseTime(item, time.seconds); });
}

bool ParseDurations(std::string_view text, TimeList& out) {
    if (!Parse(text, out)) return false;
    return std::all_of(out.begin(), out.end(), [](const Time& time) { return time.seconds >= 0; });
}

void Serialise(const TimeList& value, CssString& out) {
    SerialiseList(value, "0s", out, [](const Time& item, CssString& text) {
        AppendNumber(item.seconds, text);
        text.push_back('s');
    });
}

bool Parse(std::string_view text, IterationCount& out) {
    out = IterationCount();
    out.infinite = EqualsIgnoreCase(text, "infinite");
    return out.infinite || (ParseFloat(text, out.count) && out.count >= 0);
}

bool Parse(std::string_view text, AnimationIterationCount& out) {
    return ParseList(text, out,
                     [](std::string_view item, IterationCount& count) { return Parse(item, count); });
}

void Serialise(const AnimationIterationCount& value, CssString& out) {
    SerialiseList(value, "1", out, [](const IterationCount& item, CssString& text) {
        if (item.infinite)
            text.append("infinite");
        else
            AppendNumber(item.count, text);
    });
}

namespace {

template <class List>
bool ParseKeywordList(std::string_view text, List& out) {
    return ParseList(text, out, [](std::string_view item, auto& word) { return ParseKeyword(item, word); });
}

template <class List>
void SerialiseKeywordList(const List& list, std::string_view whenEmpty, CssString& out) {
    SerialiseList(list, whenEmpty, out, [](auto word, CssString& text) { text.append(KeywordText(word)); });
}

}  // namespace

bool Parse(std::string_view text, AnimationFillMode& out) {
    return ParseKeywordList(text, out);
}
void Serialise(const AnimationFillMode& value, CssString& out) {
    SerialiseKeywordList(value, "none", out);
}

bool Parse(std::string_view text, AnimationDirection& out) {
    return ParseKeywordList(text, out);
}
void Serialise(const AnimationDirection& value, CssString& out) {
    SerialiseKeywordList(value, "normal", out);
}

bool Parse(std::string_view text, AnimationPlayState& out) {
    return ParseKeywordList(text, out);
}
void Serialise(const AnimationPlayState& value, CssString& out) {
    SerialiseKeywordList(value, "running", out);
}

namespace {

struct NamedCurve {
    std::string_view name;
    TimingFunction function;
};

// CSS Easing Functions Level 1, 2.
constexpr NamedCurve kNamedCurves[] = {
    {"ease", TimingFunction()},
    {"linear", TimingFunction::Bezier(0, 0, 1, 1)},
    {"ease-in", TimingFunction::Bezier(0.42f, 0, 1, 1)},
    {"ease-out", TimingFunction::Bezier(0, 0, 0.58f, 1)},
    {"ease-in-out", TimingFunction::Bezier(0.42f, 0, 0.58f, 1)},
    {"step-start", TimingFunction::Steps(1, true)},
    {"step-end", TimingFunction::Steps(1, false)},
};

bool ParseSteps(std::string_view arguments, TimingFunction& out) {
    ListReader list(arguments);
    std::string_view count, position = "end", extra;
    if (!list.Next(count)) return false;
    if (list.Next(position) && list.Next(extra)) return false;
    int32_t steps;
    if (!ParseInt(count, steps) || steps < 1) return false;
    bool atStart = EqualsIgnoreCase(position, "start");
    if (!atStart && !EqualsIgnoreCase(position, "end")) return false;
    out = TimingFunction::Steps(static_cast<float>(steps), atStart);
    return true;
}

bool ParseBezier(std::string_view arguments, TimingFunction& out) {
    ListReader list(arguments);
    float* const numbers[] = {&out.x1, &out.y1, &out.x2, &out.y2};
    std::string_view item;
    for (float* number : numbers)
        if (!list.Next(item) || !ParseFloat(item, *number)) return false;
    return !list.Next(item) && out.x1 >= 0 && out.x1 <= 1 && out.x2 >= 0 && out.x2 <= 1;
}

}  // namespace

bool Parse(std::string_view text, TimingFunction& out) {
    out = TimingFunction();
    for (const NamedCurve& curve : kNamedCurves) {
        if (!EqualsIgnoreCase(text, curve.name)) continue;
        out = curve.function;
        return true;
    }
    std::string_view arguments;
    if (TakeFunction(text, "steps", arguments)) return ParseSteps(arguments, out);
    return TakeFunction(text, "cubic-bezier", arguments) && ParseBezier(arguments, out);
}

bool Parse(std::string_view text, TimingFunctionList& out) {
    return ParseList(text, out,
                     [](std::string_view item, TimingFunction& function) { return Parse(item, function); });
}

static void SerialiseTiming(const TimingFunction& function, CssString& out) {
    for (const NamedCurve& curve : kNamedCurves) {
        if (!(curve.function == function)) continue;
        out.append(curve.name);
        return;
    }
    if (function.kind == TimingFunctionKind::Steps) {
        out.append("steps(");
        AppendNumber(function.count, out);
        out.append(function.position > 0 ? ", start)" : ", end)");
        return;
    }
    std::string_view before = "cubic-bezier(";
    for (float number : {function.x1, function.y1, function.x2, function.y2}) {
        out.append(before);
        AppendNumber(number, out);
        before = ", ";
    }
    out.push_back(')');
}

void Serialise(const TimingFunctionList& value, CssString& out) {
    SerialiseList(value, "ease", out, SerialiseTiming);
}

bool Parse(std::string_view text, TransitionProperty& out) {
    if (EqualsIgnoreCase(text, "none")) return true;
    const bool read = ParseList(text, out, [](std::string_view item, TransitionTarget& target) {
        target = TransitionTarget();
        if (EqualsIgnoreCase(item, "all")) return true;
        target.kind = TransitionTargetKind::None;
        if (EqualsIgnoreCase(item, "none")) return true;
        if (!IsIdentifier(item)) return false;
        target.property = FindProperty(item);
        if (target.property != PropertyId::kUnknown)
            target.kind = TransitionTargetKind::Property;
        else
            LogDebug("Transition property ", item, " is not recognized.");
        return true;
    });
    // A name that is no property leaves nothing to run, as "none" does.
    if (out.items.size() == 1 && out.items[0].kind == TransitionTargetKind::None) out.items.clear();
    return read;
}

void Serialise(const TransitionProperty& value, CssString& out) {
    SerialiseList(value, "none", out, [](const TransitionTarget& item, CssString& text) {
        static constexpr std::string_view kWords[] = {"all", "none"};
        text.append(item.kind == TransitionTargetKind::Property ? PropertyName(item.property)
                                                                : kWords[static_cast<size_t>(item.kind)]);
    });
}

}  // namespace qorvex::css
