// Rectangles that script gets.
#pragma once

#include "script/pooled_memory.h"
#include "script/scripting_handle_enabled.h"

namespace qorvex::dom {

class DOMRectReadOnly : public script::ScriptingHandleEnabledRefCounted {
    QORVEX_SCRIPT_CLASS(DOMRectReadOnly)
  public:
    DOMRectReadOnly(float x, float y, float width, float height)
        : x_(x), y_(y), width_(width), height_(height) {}

    float GetX() const { return x_; }
    float GetY() const { return y_; }
    float GetWidth() const { return width_; }
    float GetHeight() const { return height_; }
    float GetLeft() const { return width_ < 0 ? x_ + width_ : x_; }
    float GetTop() const { return height_ < 0 ? y_ + height_ : y_; }
    float GetRight() const { return width_ < 0 ? x_ : x_ + width_; }
    float GetBottom() const { return height_ < 0 ? y_ : y_ + height_; }

  protected:
    float x_;
    float y_;
    float width_;
    float height_;
};

class DOMRect final : public DOMRectReadOnly {
    QORVEX_SCRIPT_CLASS(DOMRect)
  public:
    QORVEX_POOLED(DOMRect, 64)

    using DOMRectReadOnly::DOMRectReadOnly;
    void SetX(float x) { x_ = x; }
    void SetY(float y) { y_ = y; }
    void SetWidth(float width) { width_ = width; }
    void SetHeight(float height) { height_ = height; }
};

}  // namespace qorvex::dom
