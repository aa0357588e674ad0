// An element: attributes, the style that was declared for it, and what the cascade matched.
//
// Attributes live in four places: `id`, `class` and `style` in fields of their own, "data-" names in the
// dataset of the rare data, all others in one short array. Names and values are atoms; all comparisons are by
// pointer.
#pragma once

#include "css/values/match_state.h"
#include "css/values/property_set.h"
#include "css/values/style_declaration_set.h"
#include "dom/node.h"

namespace qorvex::css {
class Stylesheet;
}

namespace qorvex::dom {

class Attr;
class DOMRect;
class DOMTokenList;
class HTMLCollection;
class ILoadedResource;
class NamedNodeMap;
class NodeListStatic;

class Element : public Node {
  public:
    Element(Document& document, css::TagId tag);

    // --- Attributes
    Atom GetId() const { return id_; }
    void SetId(Atom id);
    std::span<const Atom> GetClasses() const { return {classes_.data(), classes_.size()}; }
    bool HasClass(Atom name) const;
    bool AddClass(std::string_view name);
    bool RemoveClass(std::string_view name);
    void SetClassName(std::string_view text);
    Atom GetClassName() const;

    std::optional<Atom> GetAttribute(std::string_view name) const;
    bool HasAttribute(std::string_view name) const { return GetAttribute(name).has_value(); }
    void SetAttribute(std::string_view name, std::string_view value);
    void RemoveAttribute(std::string_view name);
    size_t GetAttributeCount() const;
    bool HasAttributes() const { return GetAttributeCount() != 0; }
    // A fresh map of fresh Attr objects at each call.
    RefPtr<NamedNodeMap> GetAttributes();
    RefPtr<Attr> GetAttributeNode(std::string_view name);

    // For selectors: the stored value or null. `FindDataAttribute` takes the name without "data-".
    const Atom* FindAttribute(Atom name) const;
    const Atom* FindDataAttribute(Atom name) const;
    std::span<const AttributePair> GetPlainAttributes() const {
        return {attributes_.data(), attributes_.size()};
    }
    std::span<const AttributePair> GetDataset() const;
    void SetDataAttribute(std::string_view unprefixed_name, std::string_view value);
    bool RemoveDataAttribute(std::string_view unprefixed_name);

    virtual void AttributeChanged(Atom name, std::optional<Atom> old_value, std::optional<Atom> new_value);
    RefPtr<DOMTokenList> GetClassList();

    // --- Style
    css::MatchState& GetMatchState() { return match_state_; }
    css::PropertySet& GetDirtyProperties() { return dirty_properties_; }
    const css::PropertySet& GetDirtyProperties() const { return dirty_properties_; }
    css::StyleDeclarationSet* GetInlineStyle() const { return inline_style_.get(); }
    css::StyleDeclarationSet& EnsureInlineStyle();
    css::StyleDeclarationSet* GetExtraStyle() const { return extra_style_.get(); }
    css::StyleDeclarationSet& EnsureExtraStyle();
    // Text of a style attribute: replaces the inline declarations.
    void SetInlineStyleText(std::string_view text);

    void MarkStyleDirty() override;
    void ClearStyleSolved() override;
    void OnHoverChanged() override;
    void OnActiveChanged() override;
    virtual void OnPseudoStateChanged();

    // --- Queries
    RefPtr<HTMLCollection> GetElementsByTagName(std::string_view name);
    RefPtr<HTMLCollection> GetElementsByClassName(std::string_view name);
    Element* QuerySelector(std::string_view selector);
    RefPtr<NodeListStatic> QuerySelectorAll(std::string_view selector);
    bool Matches(std::string_view selector);
    Element* Closest(std::string_view selector);
    Element* GetFirstElementChild() const;
    Element* GetLastElementChild() const;
    size_t GetChildElementCount() const;
    RefPtr<HTMLCollection> GetChildElements();

    // --- Content
    void SetInnerHTML(std::string_view text);
    bool InsertAdjacentHTML(std::string_view position, std::string_view text);
    RefPtr<Node> InsertAdjacentElement(std::string_view position, RefPtr<Node> node);
    void InsertAdjacentText(std::string_view position, std::string_view text);

    // --- Geometry of the last finished layout, transforms included, in view pixels.
    RefPtr<DOMRect> GetBoundingClientRect();
    bool GetBoundingBox(float& x, float& y, float& width, float& height) const;

    // --- Focus
    bool HasTabIndex() const { return HasAttribute("tabindex"); }
    virtual void Focus();
    virtual void Blur();

    // --- Answers of the loader. A null resource or sheet means failure.
    virtual void OnResourceLoaded(uint32_t id, const ILoadedResource* resource);
    virtual void OnStylesheetLoaded(uint32_t id, RefPtr<css::Stylesheet> sheet);

    // --- Node
    void ToDebugString(NodeText& out) const override;
    RefPtr<Node> CloneNode(bool deep) override;
    void OnInsertedIntoDocument() override;
    void OnRemovedFromDocument() override;

  protected:
    ~Element() override;
    void CopyElementTo(Element& target, bool deep);

  private:
    bool SetAttributeImpl(Atom name, Atom value, std::optional<Atom>& old_value);
    void QueueSubtreeForMatching();

    UniquePtr<css::StyleDeclarationSet, MemoryTag::DOM> inline_style_;
    UniquePtr<css::StyleDeclarationSet, MemoryTag::DOM> extra_style_;
    css::PropertySet dirty_properties_;
    css::MatchState match_state_;
    Vector<AttributePair, MemoryTag::DOM> attributes_;
    Atom id_;
    Vector<Atom, MemoryTag::DOM> classes_;
};

}  // namespace qorvex::dom
