// document.styleSheets: the sheets of the page in the order of their application.
#pragma once

#include "core/memory/containers.h"
#include "css/parser/stylesheet.h"
#include "script/scripting_handle_enabled.h"

namespace qorvex::dom {

class Element;

class StyleSheetList final : public script::ScriptingHandleEnabledRefCounted {
    QORVEX_SCRIPT_CLASS(StyleSheetList)
  public:
    struct Entry {
        Element* owner;  // takes itself out before it dies
        css::StylesheetPtr sheet;
    };

    size_t GetLength() const { return entries_.size(); }
    const Entry* GetEntry(size_t index) const { return index < entries_.size() ? &entries_[index] : nullptr; }
    void Add(Element& owner, css::StylesheetPtr sheet) { entries_.push_back({&owner, std::move(sheet)}); }
    void Remove(const Element& owner) {
        entries_.erase_if([&](const Entry& entry) { return entry.owner == &owner; });
    }

  private:
    Vector<Entry, MemoryTag::DOM> entries_;
};

}  // namespace qorvex::dom
