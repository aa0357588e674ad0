// An element and the images of its style.

#include "core/logging/log.h"
#include "css/values/style_groups.h"
#include "display/box.h"
#include "dom/document.h"
#include "dom/style_images.h"

namespace qorvex::dom {

namespace {
StyleImages* ImagesOf(const Element& element) {
    return element.GetRareData() ? element.GetRareData()->style_images.get() : nullptr;
}
}  // namespace

void Element::TakeStyleImages() {
    StyleImages* images = ImagesOf(*this);
    if (!images) {
        if (!StyleImages::AreNamedBy(*GetStyle().visual)) return;
        NodeRareData& rare = EnsureRareData();
        rare.style_images = MakeUnique<StyleImages, MemoryTag::DOM>();
        images = rare.style_images.get();
    }
    images->Take(*this);
    GetDocument()->QueueImageChange(*this);
}

void Element::ReleaseImages(int kind, int slot) {
    StyleImages* images = ImagesOf(*this);
    if (images && kind >= StyleImages::kBackground && kind <= StyleImages::kMask)
        images->Release(static_cast<StyleImages::Group>(kind), slot);
}

void Element::OnImageLoaded(uint32_t id, const ImageInfoPtr& info, ImageState state) {
    if (!info) {
        LogWarning("Received image load notification for null resource!");
        return;
    }
    StyleImages* images = ImagesOf(*this);
    if (images && images->Update(id, info, state) && state == ImageState::Decoded)
        GetDocument()->QueueImageChange(*this);
}

void Element::OnSVGLoaded(uint32_t id, const SVGImagePtr& svg) {
    if (!svg) LogWarning("Received SVG load notification for null resource!");
    StyleImages* images = ImagesOf(*this);
    if (images && images->UpdateSVG(id, svg)) GetDocument()->QueueImageChange(*this);
}

void Element::OnImageFrame(uint32_t id, uint32_t frame, bool on_screen) {
    StyleImages* images = ImagesOf(*this);
    if (!images || !images->ShowFrame(id, frame)) return;
    on_screen ? GetDocument()->QueueImageChange(*this) : GetDocument()->QueueImageCommit(*this);
}

void Element::CommitImages() {
    const StyleImages* images = ImagesOf(*this);
    dsp::IDisplayElement* display = GetDisplayElement();
    if (images && display && display->Has(dsp::IDisplayElement::kPaintsBox))
        images->Commit(static_cast<dsp::Box&>(*display), *GetStyle().visual);
}

}  // namespace qorvex::dom
