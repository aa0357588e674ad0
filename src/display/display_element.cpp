#include "display/display_element.h"

namespace qorvex::dsp {

void IDisplayElement::Measure(layout::LayoutHandle&, float, float, MeasureMode, MeasureMode,
                              layout::Size& out) {
    out = {};
}
bool IDisplayElement::KeepsSize(layout::LayoutHandle&) {
    return false;
}
void IDisplayElement::OffsetLine(uint32_t, float, uint8_t) {}
void IDisplayElement::GrowLastLine(float) {}
uint32_t IDisplayElement::TextLength() const {
    return 0;
}

}  // namespace qorvex::dsp
