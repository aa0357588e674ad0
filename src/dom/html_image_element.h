// <img>: a picture by its address.
//
// The picture that is shown stays until the one that `src` names now is there, or has failed: pages that
// exchange pictures do not flicker. An element that waits for its picture is kept alive by its document, so
// that its "load" comes also when script has let go of it.
#pragma once

#include "dom/html_element.h"
#include "dom/image_use.h"

namespace qorvex::dom {

class HTMLImageElement final : public HTMLElement {
    QORVEX_SCRIPT_CLASS(HTMLImageElement)
  public:
    HTMLImageElement(Document& document, css::TagId tag) : HTMLElement(document, tag) {}

    // As laid out; without a box what the attribute says, else the picture's own size.
    uint32_t GetWidth() const;
    uint32_t GetHeight() const;
    void SetWidth(uint32_t value);
    void SetHeight(uint32_t value);
    // 0 by 0 until it is known.
    layout::Size GetNaturalSize() const { return shown_.GetNaturalSize(); }
    // The picture has come or failed, or none is wanted.
    bool IsComplete() const { return !wanted_.IsRequested(); }

    void AttributeChanged(AttributeName name, std::optional<Atom> old_value,
                          std::optional<Atom> new_value) override;
    void OnInsertedIntoDocument() override;
    void OnImageLoaded(uint32_t id, const ImageInfoPtr& info, ImageState state) override;
    void OnImageFrame(uint32_t id, uint32_t frame, bool on_screen) override;
    void CommitImages() override;
    layout::HandlePtr CreateLayoutNode(layout::LayoutTree& tree, layout::LayoutHandle& parent) override;

  protected:
    ~HTMLImageElement() override;
    dsp::DisplayElementPtr CreateDisplayElement() override;

  private:
    void Load(const std::optional<Atom>& source);
    // Takes over the wanted picture when its fate is known.
    void Settle();
    void ShowPicture(layout::Size old_size);
    void QueueEvent(Atom type);
    void FireEvent(Atom type);
    void SetSizeHint(AttributeName name, const std::optional<Atom>& value);
    void SetWaiting(bool waiting);

    ImageUse shown_;
    ImageUse wanted_;
    uint32_t loads_ = 0;  // an event of an address before this one is dropped
    bool requesting_ = false;
    bool waiting_ = false;  // from the request to the event
};

}  // namespace qorvex::dom
