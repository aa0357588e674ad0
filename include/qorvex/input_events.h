// Input as plain records. The client forwards each input to a View (pointers, keys, gestures) or to the
// System (gamepads); positions are pixels of the view, origin at its top left corner, y down.
#pragma once

#include <cstdint>

namespace qorvex {

// Six bytes; non-zero means held (or locked).
struct EventModifiers {
    std::uint8_t ShiftKey = 0;
    std::uint8_t CtrlKey = 0;
    std::uint8_t AltKey = 0;
    std::uint8_t MetaKey = 0;
    std::uint8_t NumLock = 0;
    std::uint8_t CapsLock = 0;
};

struct MouseEventData {
    enum EventType : std::uint32_t { Move = 0, Down = 1, Up = 2, Wheel = 3 };

    EventType Type = Move;
    std::int32_t Button = 0;  // 0 primary, 1 middle, 2 secondary
    std::int32_t X = 0;
    std::int32_t Y = 0;
    float WheelX = 0;  // pixels
    float WheelY = 0;
    EventModifiers Modifiers;
    // Buttons held after this event; non-zero means down.
    std::uint8_t LeftDown = 0;
    std::uint8_t MiddleDown = 0;
    std::uint8_t RightDown = 0;
    std::uint8_t Button4Down = 0;
    std::uint8_t Button5Down = 0;
};

struct KeyEventData {
    enum EventType : std::uint32_t { Unknown = 0, Down = 1, Up = 2, Char = 3 };

    // Virtual key code for Down and Up; the Unicode code point for Char.
    std::int32_t KeyCode = 0;
    EventType Type = Unknown;
    EventModifiers Modifiers;
    std::uint32_t Location = 0;  // 0 standard, 1 left, 2 right, 3 numpad
    std::uint8_t Repeat = 0;     // non-zero for an auto-repeated Down
};

struct TouchEventData {
    enum EventType : std::uint32_t { Move = 0, Down = 1, Up = 2 };

    std::int32_t X = 0;
    std::int32_t Y = 0;
    std::uint32_t Id = 0;  // the finger, from Down to Up
    EventType Type = Move;
    // Copied into the page's Touch object, not looked at by the engine.
    std::uint32_t Extra[2] = {0, 0};
};

// A gesture recognised by the client. Which words of Data are used depends on Type:
//   Fling   [0] duration in milliseconds; [2], [3] start point; [4], [5] end point
//   Pan     [0], [1] delta; [4], [5] point
//   PanEnd  none
//   Tap     [2], [3] point
struct GestureEventData {
    enum EventType : std::uint32_t { Unknown = 0, Fling = 1, Pan = 2, PanEnd = 3, Tap = 4 };

    float Data[6] = {0, 0, 0, 0, 0, 0};
    EventType Type = Unknown;
};

// State of a gamepad that was announced with System::AddGamepad. The arrays hold one float for each button (0
// to 1) and each axis (-1 to 1), as many as were announced; they are read during the call only.
struct GamepadState {
    std::uint32_t Id = 0;
    std::uint32_t Timestamp = 0;
    const float* Buttons = nullptr;
    const float* Axes = nullptr;
};

// Five groups of four floats (the last word of the three-part ones is unused): position, linear velocity,
// linear acceleration, orientation (a quaternion), and angular velocity. The groups are handed to script as
// they are.
struct GamepadPoseData {
    float Groups[5][4] = {};
};

struct GamepadStateExtended {
    std::uint32_t Id = 0;
    std::uint32_t Timestamp = 0;
    const float* Buttons = nullptr;
    const float* Axes = nullptr;
    std::uint32_t Hand = 0;  // 0 none, 1 left, 2 right
    GamepadPoseData Pose;
};

// Where in its dispatch an event is when a node callback of IViewListener sees it.
struct InputEventPhase {
    enum PhaseType : std::uint32_t { None = 0, Capturing = 1, AtTarget = 2, Bubbling = 3 };
};

// What a node callback wants to happen with the event.
struct EventAction {
    enum Actions : std::uint32_t {
        ContinueHandling = 0,
        StopHandling = 1,  // no further node sees the event, and its default action does not run
    };
};

}  // namespace qorvex
