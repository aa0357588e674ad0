#include "dom/character_data.h"

#include "core/logging/log.h"
#include "dom/document.h"
#include "dom/observer_hooks.h"
#include "script/make_handle.h"
#include "script/scripting_context.h"

namespace qorvex::dom {

using qsl::RefPtr;

namespace {
uint32_t CountCodePoints(std::string_view text) {
    uint32_t count = 0;
    for (const char c : text)
        count += (static_cast<unsigned char>(c) & 0xC0) != 0x80;
    return count;
}
}  // namespace

CharacterData::CharacterData(Document& document, uint32_t flags, std::string_view data)
    : Node(document, flags), data_(data), length_(CountCodePoints(data)) {}

void CharacterData::SetData(std::string_view text) {
    Document& document = *GetDocument();
    if ((document.mutationObserverKinds & kMutationCharacterData) && document.mutationRegistry)
        document.mutationRegistry->QueueCharacterData(*this, data_);
    if (data_.view() != text) {
        data_ = NodeText(text);  // a copy first: `text` may be a part of the old data
        length_ = CountCodePoints(data_);
        OnTextChanged();
    }
    if (document.inspector) document.inspector->OnCharacterDataChanged(*this);
}

void CharacterData::RaiseRangeError(std::string_view message) {
    LogError(message);
    script::RaiseError(GetScriptingContext(), message);
}

NodeText CharacterData::SubstringData(size_t offset, size_t count) {
    if (offset > data_.size()) {
        RaiseRangeError(
            "Failed to execute 'substringData' on 'CharacterData': The offset is greater than the node's "
            "length.");
        return NodeText();
    }
    return NodeText(data_.view().substr(offset, count));
}

void CharacterData::ReplaceData(size_t offset, size_t count, std::string_view text) {
    if (offset > data_.size()) {
        RaiseRangeError(
            "Failed to execute 'replaceData' on 'CharacterData': The offset is greater than the node's "
            "length.");
        return;
    }
    NodeText edited(data_.view().substr(0, offset));
    edited.append(text);
    if (count < data_.size() - offset) edited.append(data_.view().substr(offset + count));
    SetData(edited);
}

RefPtr<Node> Comment::CloneNode(bool deep) {
    RefPtr<Comment> clone = script::MakeHandle<Comment>(*GetDocument(), GetData());
    CopyCommon(*clone, deep);
    return clone;
}

}  // namespace qorvex::dom
