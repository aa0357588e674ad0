// Text and comments.
#pragma once

#include "dom/node.h"

namespace qorvex::dom {

class CharacterData : public Node {
  public:
    std::string_view GetData() const { return data_; }
    void SetData(std::string_view text);
    // Code points, recounted at each change; the offsets of the editing operations count bytes.
    uint32_t GetLength() const { return length_; }

    std::optional<std::string_view> GetNodeValue() const override { return GetData(); }
    void SetNodeValue(std::string_view value) override { SetData(value); }
    NodeText GetTextContent() const override { return NodeText(GetData()); }
    void SetTextContent(std::string_view text) override { SetData(text); }
    void OnComputedStyleChanged() override;

    // The first two raise a script error when the offset is beyond the end, and change nothing.
    NodeText SubstringData(size_t offset, size_t count);
    void ReplaceData(size_t offset, size_t count, std::string_view text);
    void AppendData(std::string_view text) { ReplaceData(data_.size(), 0, text); }
    void InsertData(size_t offset, std::string_view text) { ReplaceData(offset, 0, text); }
    void DeleteData(size_t offset, size_t count) { ReplaceData(offset, count, {}); }

    // The text as it is shown: after text-transform.
    std::string_view GetDisplayedText() const;

  protected:
    CharacterData(Document& document, uint32_t flags, std::string_view data);
    virtual void UpdateDisplayText() {}

  private:
    void UpdateTransformedText();

    NodeText data_;
    uint32_t length_ = 0;
};

class Text final : public CharacterData {
  public:
    Text(Document& document, std::string_view data);

    RefPtr<Node> CloneNode(bool deep) override;
    void OnInsertedIntoDocument() override;
    // Cuts this text at `offset` bytes; the rest becomes a new text behind it.
    RefPtr<Text> SplitText(size_t offset);

  protected:
    void UpdateDisplayText() override;
};

class Comment final : public CharacterData {
  public:
    Comment(Document& document, std::string_view data);

    RefPtr<Node> CloneNode(bool deep) override;
    RefPtr<layout::LayoutHandle> CreateLayoutNode(layout::LayoutTree&, layout::LayoutHandle&) override;
};

}  // namespace qorvex::dom
