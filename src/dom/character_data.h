// Text and comments.
#pragma once

#include "core/memory/atoms.h"
#include "css/values/shared_style.h"
#include "dom/node.h"
#include "layout/text/text_positions.h"
#include "script/pooled_memory.h"

namespace qorvex::dom {

class CharacterData : public Node {
    QORVEX_SCRIPT_CLASS(CharacterData)
  public:
    std::string_view GetData() const { return data_; }
    void SetData(std::string_view text);
    // Code points, recounted at each change; the offsets of the editing operations count bytes.
    uint32_t GetLength() const { return length_; }

    std::optional<std::string_view> GetNodeValue() const override { return GetData(); }
    void SetNodeValue(std::string_view value) override { SetData(value); }
    NodeText GetTextContent() const override { return NodeText(GetData()); }
    void SetTextContent(std::string_view text) override { SetData(text); }

    // An offset beyond the end raises a script error and changes nothing.
    NodeText SubstringData(size_t offset, size_t count);
    void ReplaceData(size_t offset, size_t count, std::string_view text);
    void AppendData(std::string_view text) { ReplaceData(data_.size(), 0, text); }
    void InsertData(size_t offset, std::string_view text) { ReplaceData(offset, 0, text); }
    void DeleteData(size_t offset, size_t count) { ReplaceData(offset, count, {}); }

  protected:
    CharacterData(Document& document, uint32_t flags, std::string_view data);
    // The data changed, or what text-transform makes of it.
    virtual void OnTextChanged() {}

  private:
    void RaiseRangeError(std::string_view message);

    NodeText data_;
    uint32_t length_ = 0;
};

class Text final : public CharacterData {
    QORVEX_SCRIPT_CLASS(Text)
  public:
    QORVEX_POOLED(Text, 160)
    Text(Document& document, std::string_view data);
    ~Text() override;

    Atom GetNodeName() const override { return atoms::kText; }
    void ToDebugString(NodeText& out) const override;
    qsl::RefPtr<Node> CloneNode(bool deep) override;
    void OnInsertedIntoDocument() override;
    void OnComputedStyleChanged() override;
    layout::HandlePtr CreateLayoutNode(layout::LayoutTree& tree, layout::LayoutHandle& parent) override;
    // Its parent's text values, and of the others what texts are laid out and painted with.
    const css::LaidOutStyle& GetStyle() const { return *style_; }
    void SetStyle(css::SharedStylePtr style);
    css::WrittenGroups* GetWrittenGroups() override { return &written_; }
    // Cuts this text at `offset` bytes; the rest becomes a new text behind it.
    qsl::RefPtr<Text> SplitText(size_t offset);

    // The text as it is shown: after text-transform.
    std::string_view GetDisplayedText() const {
        const NodeRareData* rare = GetRareData();
        return rare && rare->transformed_text ? rare->transformed_text->view() : GetData();
    }
    // Hands the shown text to the display element; at the commit, while the layout side is idle.
    void CommitDisplayedText();

    // As of the last painted layout; null, with a line in the log, before the first one.
    const layout::TextPositions* GetTextPositions() const;
    const layout::TextFontStyle* GetFontStyle() const { return font_style_.get(); }
    void TakeTextPositions(qsl::RefPtr<layout::TextPositions> positions) {
        positions_ = std::move(positions);
    }
    void TakeFontStyle(qsl::RefPtr<layout::TextFontStyle> style) { font_style_ = std::move(style); }

  protected:
    void OnTextChanged() override;
    const css::LaidOutStyle* GetOwnLaidOutStyle() const override { return style_.get(); }
    void ResetStyle() override;

  private:
    friend class ShownText;

    void UpdateTransformedText();
    void ForgetTransformedText();

    css::WrittenGroups written_;
    css::SharedStylePtr style_;
    qsl::RefPtr<layout::TextPositions> positions_;
    qsl::RefPtr<layout::TextFontStyle> font_style_;
};
static_assert(sizeof(Text) <= 160, "as many bytes as the pool gives");

class Comment final : public CharacterData {
    QORVEX_SCRIPT_CLASS(Comment)
  public:
    Comment(Document& document, std::string_view data) : CharacterData(document, kIsComment, data) {}

    Atom GetNodeName() const override { return atoms::kComment; }
    void ToDebugString(NodeText& out) const override { out.append("Comment"); }
    qsl::RefPtr<Node> CloneNode(bool deep) override;
    layout::HandlePtr CreateLayoutNode(layout::LayoutTree&, layout::LayoutHandle&) override {
        return nullptr;
    }
};

}  // namespace qorvex::dom
