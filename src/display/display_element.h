// What a layout node carries to measure and paint its own content.
//
// Made by the DOM element, shared by count with both halves of its layout handle. Read and changed on the
// layout thread; by the DOM thread only at the commit. Whatever else the DOM wants changed travels as a
// scheduled layout task.
#pragma once

#include "core/memory/ref_counted.h"
#include "layout/geometry.h"

#include <atomic>
#include <cstdint>

namespace fresco {
class CommandBuffer;
}

namespace qorvex::layout {
class LayoutHandle;
struct LayoutNode;
}  // namespace qorvex::layout

namespace qorvex::dsp {

class PaintContext;

enum class MeasureMode : uint8_t { Undefined, Exactly, AtMost };

class IDisplayElement {
  public:
    static constexpr MemoryTag kMemoryTag = MemoryTag::Rendering;
    enum Flag : uint32_t {
        kPaintsBox = 1u << 0,  // paints backgrounds and borders
        kMeasures = 1u << 1,   // its size comes from Measure; it is a leaf of the box layout
        kHasMask = 1u << 2,
        kIsText = 1u << 3,         // a DisplayText
        kFlowsChildren = 1u << 4,  // a DisplayParagraph: it gives its children their boxes
        kReplaced = 1u << 5,       // a DisplayImage: sides that the style leaves open come from its content
        kPaintsContent = 1u << 6,  // a box that shows more than its style
    };

    IDisplayElement(const IDisplayElement&) = delete;
    IDisplayElement& operator=(const IDisplayElement&) = delete;

    uint32_t Flags() const { return flags_; }
    bool Has(Flag flag) const { return (flags_ & flag) != 0; }

    void AddRef() const { count_.fetch_add(1, std::memory_order_relaxed); }
    void Release() const {
        if (count_.fetch_sub(1, std::memory_order_acq_rel) == 1)
            const_cast<IDisplayElement*>(this)->Dispose();
    }

    virtual ~IDisplayElement() = default;
    // Records the element's own commands, without its children.
    virtual void Paint(PaintContext& context, bool dirty, const layout::LayoutNode& node,
                       fresco::CommandBuffer& buffer) = 0;
    // NaN stands for an available size that is not known.
    virtual void Measure(layout::LayoutHandle& handle, float availableWidth, float availableHeight,
                         MeasureMode widthMode, MeasureMode heightMode, layout::Size& out);
    // Whether everything that Measure answered since the last false is still so, though the content changed.
    virtual bool KeepsSize(layout::LayoutHandle& handle);
    // Moves one text line; used by the inline flow of a paragraph.
    virtual void OffsetLine(uint32_t lineIndex, float offset, uint8_t alignment);
    virtual void GrowLastLine(float amount);
    // Bytes of text of this element.
    virtual uint32_t TextLength() const;

  protected:
    explicit IDisplayElement(uint32_t flags) : flags_(flags) {}
    // Nobody holds the element any more.
    virtual void Dispose() { Delete<kMemoryTag>(this); }
    void SetFlag(Flag flag, bool on) { flags_ = on ? flags_ | flag : flags_ & ~flag; }

  private:
    mutable std::atomic<uint32_t> count_{1};
    uint32_t flags_;
};

using DisplayElementPtr = qsl::RefPtr<IDisplayElement>;
}  // namespace qorvex::dsp
