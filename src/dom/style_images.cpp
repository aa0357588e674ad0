#include "dom/style_images.h"

#include <algorithm>

#include "css/values/style_groups.h"
#include "dom/document.h"

namespace qorvex::dom {

using css::ImageKind;
using css::ImageValue;

bool StyleImages::AreNamedBy(const css::VisualStyle& style) {
    return style.borderImageSource.kind == ImageKind::Url || style.maskImage.kind == ImageKind::Url ||
           std::any_of(style.backgroundImage.begin(), style.backgroundImage.end(),
                       [](const ImageValue& image) { return image.kind == ImageKind::Url; });
}

template <class Visitor>
bool StyleImages::Any(Visitor&& visit) {
    bool any = false;
    for (Images& images : groups_) {
        for (Image& image : images)
            any |= visit(image.use);
    }
    return any;
}

void StyleImages::Take(Element& element) {
    const css::VisualStyle& style = *element.GetStyle().visual;
    TakeGroup(element, groups_[kBackground], {style.backgroundImage.begin(), style.backgroundImage.end()});
    TakeGroup(element, groups_[kBorder], {&style.borderImageSource, 1});
    TakeGroup(element, groups_[kMask], {&style.maskImage, 1});
}

void StyleImages::TakeGroup(Element& element, Images& images, std::span<const ImageValue> wanted) {
    Images before = std::move(images);
    images.clear();
    size_t count = wanted.size();
    while (count > 0 && wanted[count - 1].kind != ImageKind::Url)
        --count;
    for (size_t i = 0; i < count; ++i) {
        Image& image = images.emplace_back();
        if (wanted[i].kind != ImageKind::Url) continue;
        image.url = wanted[i].url;
        const auto same = std::find_if(before.begin(), before.end(), [&](const Image& old) {
            return old.use.IsRequested() && old.url == image.url;
        });
        if (same != before.end()) image.use = std::move(same->use);
    }
    // In place by now: news may come inside the request.
    for (Image& image : images) {
        if (!image.use.IsRequested() && !image.url.empty())
            image.use.Request(element, element.GetDocument()->ResolveURL(image.url.view()));
    }
    // What was there before goes last, so that an image which moved between nodes is never without a holder.
}

void StyleImages::Release(Group group, int slot) {
    Images& images = groups_[group];
    if (slot < 0) return images.clear();
    if (static_cast<size_t>(slot) < images.size()) images[static_cast<uint32_t>(slot)] = Image();
}

bool StyleImages::Update(uint32_t id, const ImageInfoPtr& info, ImageState state) {
    return Any([&](ImageUse& use) { return use.Update(id, info, state); });
}

bool StyleImages::UpdateSVG(uint32_t id, const SVGImagePtr& svg) {
    return Any([&](ImageUse& use) { return use.UpdateSVG(id, svg); });
}

bool StyleImages::ShowFrame(uint32_t id, uint32_t frame) {
    return Any([&](ImageUse& use) { return use.ShowFrame(id, frame); });
}

void StyleImages::Commit(dsp::Box& box, const css::VisualStyle& style) const {
    dsp::Box::Images& slots = box.EnsureImages();
    box.SetHasMask(style.maskImage.kind > ImageKind::Initial);
    dsp::ImageSlots* const targets[] = {&slots.background, &slots.border, &slots.mask};
    for (size_t group = 0; group < std::size(targets); ++group) {
        targets[group]->clear();
        for (const Image& image : groups_[group])
            targets[group]->push_back(image.use.MakeSlot());
    }
}

}  // namespace qorvex::dom
