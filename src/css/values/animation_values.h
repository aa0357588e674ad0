// Value records of the animation and transition groups: lists with one item per animation or transition.
#pragma once

#include <cstdint>

#include "css/values/css_containers.h"
#include "css/values/keywords.h"
#include "css/values/property_id.h"

namespace qorvex::css {

struct Time {
    float seconds = 0;
    friend bool operator==(const Time&, const Time&) = default;
};

struct IterationCount {
    bool infinite = false;
    float count = 1;
    friend bool operator==(const IterationCount&, const IterationCount&) = default;
};

enum class TimingFunctionKind : uint8_t { CubicBezier = 0, Steps = 1 };

// Named curves are stored by their points; the default is "ease".
struct TimingFunction {
    TimingFunctionKind kind = TimingFunctionKind::CubicBezier;
    float x1 = 0.25f, y1 = 0.1f, x2 = 0.25f, y2 = 1;
    float count = 1;
    float position = -1;  // +1 start, -1 end

    static constexpr TimingFunction Bezier(float x1, float y1, float x2, float y2) {
        TimingFunction function;
        function.x1 = x1, function.y1 = y1, function.x2 = x2, function.y2 = y2;
        return function;
    }
    static constexpr TimingFunction Steps(float count, bool atStart) {
        TimingFunction function;
        function.kind = TimingFunctionKind::Steps;
        function.count = count;
        function.position = atStart ? 1.0f : -1.0f;
        return function;
    }
    friend bool operator==(const TimingFunction& a, const TimingFunction& b) {
        if (a.kind != b.kind) return false;
        if (a.kind == TimingFunctionKind::Steps) return a.count == b.count && a.position == b.position;
        return a.x1 == b.x1 && a.y1 == b.y1 && a.x2 == b.x2 && a.y2 == b.y2;
    }
};

enum class TransitionTargetKind : uint8_t { All, None, Property };

// A property may be a longhand or a shorthand. An unrecognised name is kept as None, so that the other lists
// stay in step (CSS Transitions, 2.1).
struct TransitionTarget {
    TransitionTargetKind kind = TransitionTargetKind::All;
    PropertyId property = PropertyId::kUnknown;
    friend bool operator==(const TransitionTarget&, const TransitionTarget&) = default;
};

using TimeList = ValueList<Time, struct TimeTag>;
using TimingFunctionList = ValueList<TimingFunction, struct TimingFunctionTag>;

using AnimationName = ValueList<CssString, struct AnimationNameTag>;
using AnimationDuration = TimeList;
using AnimationIterationCount = ValueList<IterationCount, struct IterationTag>;
using AnimationDelay = TimeList;
using AnimationFillMode = ValueList<AnimationFillModeItem, struct FillModeTag>;
using AnimationDirection = ValueList<AnimationDirectionItem, struct DirectionTag>;
using AnimationTimingFunction = TimingFunctionList;
using AnimationPlayState = ValueList<AnimationPlayStateItem, struct PlayStateTag>;
using TransitionProperty = ValueList<TransitionTarget, struct TransitionPropertyTag>;
using TransitionDuration = TimeList;
using TransitionDelay = TimeList;
using TransitionTimingFunction = TimingFunctionList;

}  // namespace qorvex::css
