// An element: attributes, the style that was declared for it, and what the cascade matched.
//
// Attributes live in four places: `id`, `class` and `style` in fields of their own, "data-" names in the
// dataset of the rare data, all others in one short array. Names and values are atoms; all comparisons are by
// pointer.
#pragma once

#include "css/parser/stylesheet.h"
#include "css/values/animated_properties.h"
#include "css/values/match_state.h"
#include "css/values/property_set.h"
#include "css/values/style_declaration_set.h"
#include "dom/node.h"

namespace qorvex::dom {

class Attr;
class DOMRect;
class DOMTokenList;
class HTMLCollection;
class ILoadedResource;
class NamedNodeMap;
class NodeListStatic;

// An attribute as AttributeChanged sees it: data- attributes come without their prefix.
struct AttributeName {
    Atom name;
    bool is_data = false;
};

class Element : public Node {
    QORVEX_SCRIPT_CLASS(Element)
  public:
    Element(Document& document, css::TagId tag, uint32_t extra_flags = 0);

    // --- Attributes
    Atom GetId() const { return id_; }
    std::span<const Atom> GetClasses() const { return {classes_.data(), classes_.size()}; }
    bool HasClass(Atom name) const { return classes_.contains(name); }
    bool HasClassNamed(std::string_view name) const;
    // False when the element has the class already, or does not have it.
    bool AddClass(std::string_view name);
    bool RemoveClass(std::string_view name);
    bool ReplaceClass(std::string_view old_name, std::string_view new_name);
    // The classes joined by single spaces.
    Atom GetClassName() const;

    // Names are compared without regard to case.
    std::optional<Atom> GetAttribute(std::string_view name) const;
    // The value for those who only read it. That of a style or of several classes is put into `room`: atoms
    // stay for good, and a page may write and read another style in each frame.
    std::optional<std::string_view> GetAttributeText(std::string_view name, NodeText& room) const;
    bool HasAttribute(std::string_view name) const { return FindStored(name).has_value(); }
    void SetAttribute(std::string_view name, std::string_view value);
    void RemoveAttribute(std::string_view name);
    size_t GetAttributeCount() const;
    bool HasAttributes() const { return GetAttributeCount() != 0; }
    // In the order of GetAttributes; the visitor gets the full name and returns false to stop.
    template <class Visitor>
    void ForEachAttribute(Visitor&& visit) const;
    // A fresh map of fresh Attr objects at each call.
    qsl::RefPtr<NamedNodeMap> GetAttributes();
    // Null when there is no such attribute.
    qsl::RefPtr<Attr> GetAttributeNode(std::string_view name);
    // Takes over name and value; gives the attribute that stood there before.
    qsl::RefPtr<Attr> SetAttributeNode(Attr& attribute);
    qsl::RefPtr<Attr> RemoveAttributeNode(Attr& attribute);

    // For selectors: the stored value or null. Id, class and style are stored elsewhere; FindAttribute does
    // not know them. FindDataAttribute takes the name without "data-".
    const Atom* FindAttribute(Atom name) const;
    const Atom* FindDataAttribute(Atom name) const;
    std::span<const AttributePair> GetPlainAttributes() const {
        return {attributes_.data(), attributes_.size()};
    }
    std::span<const AttributePair> GetDataset() const;
    void SetDataAttribute(std::string_view unprefixed_name, std::string_view value);
    bool RemoveDataAttribute(std::string_view unprefixed_name);

    virtual void AttributeChanged(AttributeName name, std::optional<Atom> old_value,
                                  std::optional<Atom> new_value);
    qsl::RefPtr<DOMTokenList> GetClassList();

    // --- Style. What the solver reads and writes on every visit.
    css::LayoutStyleRefs& GetStyle() { return style_; }
    const css::LayoutStyleRefs& GetStyle() const { return style_; }
    // Null until the element was matched.
    const css::MatchState* GetMatchState() const { return match_state_.get(); }
    // Gives the one that stood there before.
    css::MatchStatePtr SetMatchState(css::MatchStatePtr state) {
        return std::exchange(match_state_, std::move(state));
    }
    css::PropertySet& GetDirtyProperties() { return dirty_properties_; }
    const css::PropertySet& GetDirtyProperties() const { return dirty_properties_; }
    // What running animations and transitions say; null without any.
    qsl::RefPtr<css::AnimatedProperties> animatedProperties;
    qsl::RefPtr<css::TransitionProperties> transitionProperties;
    // Null until first use.
    css::StyleDeclarationSet* GetInlineStyle() const { return inline_style_.get(); }
    css::StyleDeclarationSet& EnsureInlineStyle();
    css::StyleDeclarationSet* GetExtraStyle() const {
        return GetRareData() ? GetRareData()->extra_style.get() : nullptr;
    }
    css::StyleDeclarationSet& EnsureExtraStyle();
    // Replaces the inline declarations by those of a style attribute's text.
    void SetInlineStyleText(std::string_view text);

    void MarkStyleDirty() override;
    void ClearStyleSolved() override;
    void OnHoverChanged() override { MarkPseudoDependentChain(kHoverDependent | kHoverDependentQueued); }
    void OnActiveChanged() override { OnPseudoStateChanged(); }
    virtual void OnPseudoStateChanged() {
        MarkPseudoDependentChain(kActiveFocusDependent | kActiveFocusDependentQueued);
    }

    // --- Images of the style
    void TakeStyleImages();
    void ReleaseImages(int kind, int slot) override;
    void OnImageLoaded(uint32_t id, const ImageInfoPtr& info, ImageState state) override;
    void OnSVGLoaded(uint32_t id, const SVGImagePtr& svg) override;
    void OnImageFrame(uint32_t id, uint32_t frame, bool on_screen) override;
    void CommitImages() override;

    // --- Queries
    qsl::RefPtr<HTMLCollection> GetElementsByTagName(std::string_view name);
    qsl::RefPtr<HTMLCollection> GetElementsByClassName(std::string_view name);
    Element* QuerySelector(std::string_view selector);
    qsl::RefPtr<NodeListStatic> QuerySelectorAll(std::string_view selector);
    bool Matches(std::string_view selector);
    Element* Closest(std::string_view selector);
    Element* GetFirstElementChild() const;
    Element* GetLastElementChild() const;
    size_t GetChildElementCount() const;
    qsl::RefPtr<HTMLCollection> GetChildElements();

    // --- Content
    void SetInnerHTML(std::string_view text);
    void InsertAdjacentHTML(std::string_view position, std::string_view text);
    qsl::RefPtr<Node> InsertAdjacentElement(std::string_view position, qsl::RefPtr<Node> node);
    void InsertAdjacentText(std::string_view position, std::string_view text);

    // --- Geometry of the last finished layout, transforms included, in view pixels; zeros without a box.
    qsl::RefPtr<DOMRect> GetBoundingClientRect();
    layout::Rect GetBoundingBox() const;

    // --- Focus
    virtual bool HasTabIndex() const { return HasAttribute("tabindex"); }
    virtual void Focus();
    virtual void Blur();

    // --- Answers of the loader. A null resource or sheet means failure.
    virtual void OnResourceLoaded(uint32_t, const ILoadedResource*) {}
    virtual void OnStylesheetLoaded(uint32_t, css::StylesheetPtr) {}

    // --- Node
    void ToDebugString(NodeText& out) const override;
    qsl::RefPtr<Node> CloneNode(bool deep) override;
    void OnInsertedIntoDocument() override;
    void OnRemovedFromDocument() override;
    void OnSubtreeRemoved() override;
    bool PreDispatch(Event& event) override;
    void PostDispatch(Event& event) override;

  protected:
    ~Element() override = default;
    // Attributes and declared style.
    void CopyElementTo(Element& target);
    const css::LaidOutStyle* GetOwnLaidOutStyle() const override { return &style_; }
    css::WrittenGroups* GetWrittenGroups() override { return &style_.written; }
    void ResetStyle() override;
    // The document's own atoms are not there yet while the document itself is constructed.
    struct ForDocument {};
    Element(ForDocument, Document& document);

  private:
    void InstallHandlerAttribute(Atom name, Atom value);
    enum class Store { Id, Class, Style, Plain };
    struct StoredAttribute {
        Store store;
        const Atom* value;  // null: the text has to be made, of classes or of the style
    };
    std::optional<StoredAttribute> FindStored(std::string_view name) const;
    NodeText MakeAttributeText(Store store) const;
    static Store StoreOf(Atom name);
    void SetId(Atom id);
    void SetClassName(std::string_view text);
    void SetStyleAttribute(std::string_view text);
    void OnClassesChanged();
    std::optional<Atom> ClassValueForObservers() const;
    void AnnounceClassChange(std::optional<Atom> old_value);
    void MarkPseudoDependentChain(uint16_t bits);
    void QueueDependents();
    qsl::RefPtr<Node> InsertAdjacent(std::string_view position, qsl::RefPtr<Node> node);

    css::LayoutStyleRefs style_;
    UniquePtr<css::StyleDeclarationSet, MemoryTag::DOM> inline_style_;
    css::PropertySet dirty_properties_;
    css::MatchStatePtr match_state_;
    Vector<AttributePair, MemoryTag::DOM> attributes_;
    Atom id_;
    SmallVector<Atom, 1, MemoryTag::DOM> classes_;
};

template <class Visitor>
void Element::ForEachAttribute(Visitor&& visit) const {
    if (Is(kHasId) && !visit(std::string_view("id"), id_.view())) return;
    if (Is(kHasClasses)) {
        const NodeText classes = MakeAttributeText(Store::Class);
        if (!visit(std::string_view("class"), classes.view())) return;
    }
    if (inline_style_ && !inline_style_->empty()) {
        const NodeText text = MakeAttributeText(Store::Style);
        if (!visit(std::string_view("style"), text.view())) return;
    }
    for (const AttributePair& entry : attributes_)
        if (!visit(entry.name.view(), entry.value.view())) return;
    for (const AttributePair& entry : GetDataset()) {
        NodeText name("data-");
        name.append(entry.name.view());
        if (!visit(name.view(), entry.value.view())) return;
    }
}

}  // namespace qorvex::dom
