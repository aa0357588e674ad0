// The display element of a text in a document, and at the same time the link by which layout and tasks know
// the text: both live from its first arrival in the document as long as anybody holds them.
#pragma once

#include "core/memory/pool.h"
#include "display/display_text.h"

namespace qorvex::dom {

class Text;

class ShownText final : public dsp::DisplayText,
                        public layout::INodeLink,
                        private MTPoolObject<ShownText, MemoryTag::Rendering, 64> {
  public:
    static qsl::RefPtr<ShownText> Make(dom::Text& text, IInternationalizationManager* i18n);
    // For the pool.
    ShownText(dom::Text& text, IInternationalizationManager* i18n) : DisplayText(i18n), text_(&text) {}

    // The text is dying.
    void Cut() { text_ = nullptr; }

    void AddRef() noexcept override { DisplayText::AddRef(); }
    void Release() noexcept override { DisplayText::Release(); }
    void SetInLayoutTree(bool in_tree) override;
    std::string_view DebugName() const override;
    void Receive(layout::DOMTaskKind kind, const layout::DOMTaskData& data) override;

  private:
    layout::NodeLinkPtr GetLink() override { return layout::NodeLinkPtr(this); }
    void Dispose() override { Give(this); }

    dom::Text* text_;
};
static_assert(sizeof(ShownText) == 64);

}  // namespace qorvex::dom
