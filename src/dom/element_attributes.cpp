// The attributes of an element, by where they are stored.

#include "core/memory/atoms.h"
#include "css/parser/convert.h"
#include "dom/ascii.h"
#include "dom/attr.h"
#include "dom/document.h"
#include "dom/dom_token_list.h"
#include "dom/element.h"
#include "dom/node_list.h"
#include "dom/observer_hooks.h"
#include "dom/style_engine.h"
#include "script/inline_handler_attribute.h"
#include "script/make_handle.h"
#include "script/scripting_context.h"

namespace qorvex::dom {

using qsl::RefPtr;

namespace {

constexpr std::string_view kDataPrefix = "data-";

// The lower-case form of a name without "data-". The prefix itself counts only in lower case.
struct SplitName {
    explicit SplitName(std::string_view name) : is_data(name.starts_with(kDataPrefix)) {
        if (is_data) name.remove_prefix(kDataPrefix.size());
        if (std::none_of(name.begin(), name.end(), IsAsciiUpper)) {
            view = name;
            return;
        }
        lowered.reserve(name.size());
        for (const char c : name)
            lowered.push_back(ToAsciiLower(c));
        view = lowered;
    }
    SplitName(const SplitName&) = delete;
    SplitName& operator=(const SplitName&) = delete;

    bool is_data;
    NodeText lowered;
    std::string_view view;
};

AttributePair* Find(std::span<AttributePair> pairs, Atom name) {
    for (AttributePair& pair : pairs)
        if (pair.name == name) return &pair;
    return nullptr;
}

}  // namespace

Element::Store Element::StoreOf(Atom name) {
    if (name == atoms::kId) return Store::Id;
    if (name == atoms::kClass) return Store::Class;
    return name == atoms::kStyle ? Store::Style : Store::Plain;
}

std::span<const AttributePair> Element::GetDataset() const {
    const NodeRareData* rare = GetRareData();
    return rare ? std::span<const AttributePair>(rare->dataset.data(), rare->dataset.size())
                : std::span<const AttributePair>();
}

const Atom* Element::FindAttribute(Atom name) const {
    for (const AttributePair& entry : attributes_)
        if (entry.name == name) return &entry.value;
    return nullptr;
}

const Atom* Element::FindDataAttribute(Atom name) const {
    for (const AttributePair& entry : GetDataset())
        if (entry.name == name) return &entry.value;
    return nullptr;
}

std::optional<Element::StoredAttribute> Element::FindStored(std::string_view name) const {
    const SplitName split(name);
    const Atom atom = GetDocument()->FindAtom(split.view);
    if (atom == Atom() && !split.view.empty())
        return std::nullopt;  // no element has a name that nobody interned
    bool present = false;
    StoredAttribute found{split.is_data ? Store::Plain : StoreOf(atom), nullptr};
    switch (found.store) {
        case Store::Id:
            present = Is(kHasId);
            found.value = &id_;
            break;
        case Store::Class:
            present = Is(kHasClasses);
            if (classes_.size() == 1) found.value = &classes_[0];
            break;
        case Store::Style:
            present = inline_style_ && !inline_style_->empty();
            break;
        case Store::Plain:
            found.value = split.is_data ? FindDataAttribute(atom) : FindAttribute(atom);
            present = found.value != nullptr;
            break;
    }
    return present ? std::optional(found) : std::nullopt;
}

NodeText Element::MakeAttributeText(Store store) const {
    NodeText text;
    if (store == Store::Style) {
        text = inline_style_->ToText().view();
        return text;
    }
    for (const Atom name : classes_) {
        if (!text.empty()) text.push_back(' ');
        text.append(name.view());
    }
    return text;
}

std::optional<Atom> Element::GetAttribute(std::string_view name) const {
    const std::optional<StoredAttribute> found = FindStored(name);
    if (!found) return std::nullopt;
    return found->value ? *found->value : GetDocument()->Intern(MakeAttributeText(found->store));
}

std::optional<std::string_view> Element::GetAttributeText(std::string_view name, NodeText& room) const {
    const std::optional<StoredAttribute> found = FindStored(name);
    if (!found) return std::nullopt;
    if (found->value) return found->value->view();
    room = MakeAttributeText(found->store);
    return room.view();
}

void Element::SetAttribute(std::string_view name, std::string_view value) {
    Document& document = *GetDocument();
    const RefPtr<Node> self(this);
    if (document.inspector) document.inspector->OnAttributeSet(*this, name, value);
    const SplitName split(name);
    if (split.is_data) return SetDataAttribute(split.view, value);

    const Atom atom = document.Intern(split.view);
    const Store store = StoreOf(atom);
    if (store == Store::Style) return SetStyleAttribute(value);
    std::optional<Atom> old_value;
    const Atom new_value = document.Intern(value);
    if (store == Store::Id) {
        if (Is(kHasId)) old_value = id_;
        SetId(new_value);
    } else if (store == Store::Class) {
        if (Is(kHasClasses)) old_value = GetClassName();
        SetClassName(value);
    } else if (AttributePair* pair = Find({attributes_.data(), attributes_.size()}, atom)) {
        old_value = std::exchange(pair->value, new_value);
    } else {
        attributes_.push_back({atom, new_value});
    }
    if (old_value != new_value) AttributeChanged({atom, false}, old_value, new_value);
}

void Element::SetStyleAttribute(std::string_view text) {
    // Interned texts stay for good and a page may write another style in each frame: the texts become atoms
    // for observers only.
    const bool observed = (GetDocument()->mutationObserverKinds & kMutationAttributes) != 0;
    const std::optional<Atom> old_value = observed ? GetAttribute("style") : std::nullopt;
    SetInlineStyleText(text);
    AttributeChanged({atoms::kStyle, false}, old_value, observed ? GetAttribute("style") : std::nullopt);
}

void Element::SetDataAttribute(std::string_view unprefixed_name, std::string_view value) {
    Document& document = *GetDocument();
    const RefPtr<Node> self(this);
    const Atom atom = document.Intern(unprefixed_name);
    const Atom new_value = document.Intern(value);
    auto& dataset = EnsureRareData().dataset;
    std::optional<Atom> old_value;
    if (AttributePair* pair = Find({dataset.data(), dataset.size()}, atom)) {
        old_value = pair->value;
        pair->value = new_value;
    } else {
        dataset.push_back({atom, new_value});
    }
    if (old_value != new_value) AttributeChanged({atom, true}, old_value, new_value);
    if (document.dataBinding && IsInDocument() && !Is(kBeingRemoved))
        document.dataBinding->OnDataAttribute(*this, atom, new_value);
}

bool Element::RemoveDataAttribute(std::string_view unprefixed_name) {
    NodeRareData* rare = GetRareData();
    const Atom atom = GetDocument()->FindAtom(unprefixed_name);
    if (!rare) return false;
    for (AttributePair& entry : rare->dataset) {
        if (entry.name != atom) continue;
        const Atom old_value = entry.value;
        rare->dataset.erase(&entry);
        AttributeChanged({atom, true}, old_value, std::nullopt);
        return true;
    }
    return false;
}

void Element::RemoveAttribute(std::string_view name) {
    const RefPtr<Node> self(this);
    Document& document = *GetDocument();
    const std::optional<StoredAttribute> found = FindStored(name);
    if (!found) return;
    const bool observed = (document.mutationObserverKinds & kMutationAttributes) != 0;
    const std::optional<Atom> old_value = found->value || observed ? GetAttribute(name) : std::nullopt;
    const SplitName split(name);
    if (split.is_data) {
        RemoveDataAttribute(split.view);
    } else {
        const Atom atom = document.Intern(split.view);
        switch (found->store) {
            case Store::Id:
                SetId(Atom());
                break;
            case Store::Class:
                SetClassName({});
                break;
            case Store::Style:
                inline_style_->Clear();
                MarkStyleDirty();
                break;
            case Store::Plain:
                attributes_.erase(Find({attributes_.data(), attributes_.size()}, atom));
                break;
        }
        AttributeChanged({atom, false}, old_value, std::nullopt);
    }
    if (document.inspector) document.inspector->OnAttributeRemoved(*this, name);
}

void Element::AttributeChanged(AttributeName name, std::optional<Atom> old_value,
                               std::optional<Atom> new_value) {
    Document& document = *GetDocument();
    if (new_value && !name.is_data && script::IsInlineHandlerName(name.name.view()))
        InstallHandlerAttribute(name.name, *new_value);
    const IStyleEngine& style = document.GetStyleEngine();
    if (IsInDocument() &&
        (name.is_data ? style.IsSelectorDataAttribute(name.name) : style.IsSelectorAttribute(name.name)))
        MarkStyleDirty();
    if ((document.mutationObserverKinds & kMutationAttributes) && document.mutationRegistry) {
        Atom full = name.name;
        if (name.is_data) {
            NodeText prefixed(kDataPrefix);
            prefixed.append(name.name.view());
            full = document.Intern(prefixed);
        }
        document.mutationRegistry->QueueAttribute(*this, full, old_value);
    }
}

// onclick="...": the handler is a property of the element's script object.
void Element::InstallHandlerAttribute(Atom name, Atom value) {
    const script::ScriptingContext* page = GetDocument()->GetDocumentContext();
    if (!page || !page->context) return;
    JSValueRef wrapper = nullptr;
    GetOrCreateWrapper(page->context, &wrapper);
    if (wrapper)
        script::InstallInlineHandler(page->context, const_cast<JSObjectRef>(wrapper), name.view(),
                                     value.view());
}

size_t Element::GetAttributeCount() const {
    return size_t{Is(kHasId)} + size_t{Is(kHasClasses)} + size_t{inline_style_ && !inline_style_->empty()} +
           attributes_.size() + GetDataset().size();
}

RefPtr<NamedNodeMap> Element::GetAttributes() {
    RefPtr<NamedNodeMap> map = script::MakeHandle<NamedNodeMap>();
    ForEachAttribute([&](std::string_view name, std::string_view value) {
        map->Add(script::MakeHandle<Attr>(*GetDocument(), name, value, this));
        return true;
    });
    return map;
}

RefPtr<Attr> Element::GetAttributeNode(std::string_view name) {
    NodeText room;
    const std::optional<std::string_view> value = GetAttributeText(name, room);
    if (!value) return nullptr;
    return script::MakeHandle<Attr>(*GetDocument(), name, *value, this);
}

RefPtr<Attr> Element::SetAttributeNode(Attr& attribute) {
    RefPtr<Attr> old = GetAttributeNode(attribute.GetName());
    const NodeText value(attribute.GetValue());
    attribute.SetOwnerElement(*this);
    SetAttribute(attribute.GetName(), value);
    return old;
}

RefPtr<Attr> Element::RemoveAttributeNode(Attr& attribute) {
    if (attribute.GetOwnerElement() != this) return nullptr;
    RemoveAttribute(attribute.GetName());
    return RefPtr<Attr>(&attribute);
}

// --- id

void Element::SetId(Atom id) {
    if (id == id_) return;
    const Atom old_id = id_;
    id_ = id;
    SetFlag(kHasId, id != Atom());
    if (IsInDocument()) GetDocument()->OnIdChanged(*this, old_id);
    MarkStyleDirty();
}

// --- class

bool Element::HasClassNamed(std::string_view name) const {
    const Atom atom = GetDocument()->FindAtom(name);
    return atom != Atom() && HasClass(atom);
}

Atom Element::GetClassName() const {
    if (classes_.empty()) return Atom();
    if (classes_.size() == 1) return classes_[0];
    return GetDocument()->Intern(MakeAttributeText(Store::Class));
}

void Element::OnClassesChanged() {
    SetFlag(kHasClasses, !classes_.empty());
    GetDocument()->ForgetClassCollections(*this);
    MarkStyleDirty();
}

void Element::SetClassName(std::string_view text) {
    if (text.empty() && classes_.empty()) return;
    classes_.clear();
    for (size_t i = 0; i < text.size();) {
        while (i < text.size() && IsAsciiSpace(text[i]))
            ++i;
        const size_t start = i;
        while (i < text.size() && !IsAsciiSpace(text[i]))
            ++i;
        if (i > start) classes_.push_back(GetDocument()->Intern(text.substr(start, i - start)));
    }
    OnClassesChanged();
}

bool Element::AddClass(std::string_view name) {
    const Atom atom = GetDocument()->Intern(name);
    if (HasClass(atom)) return false;
    const std::optional<Atom> old_value = ClassValueForObservers();
    classes_.push_back(atom);
    OnClassesChanged();
    AnnounceClassChange(old_value);
    return true;
}

bool Element::RemoveClass(std::string_view name) {
    const Atom atom = GetDocument()->FindAtom(name);
    if (atom == Atom() || !HasClass(atom)) return false;
    const std::optional<Atom> old_value = ClassValueForObservers();
    classes_.erase_if([&](Atom other) { return other == atom; });
    OnClassesChanged();
    AnnounceClassChange(old_value);
    return true;
}

bool Element::ReplaceClass(std::string_view old_name, std::string_view new_name) {
    const Atom old_atom = GetDocument()->FindAtom(old_name);
    if (old_atom == Atom() || !HasClass(old_atom)) return false;
    const Atom new_atom = GetDocument()->Intern(new_name);
    const std::optional<Atom> old_value = ClassValueForObservers();
    if (old_atom != new_atom) {
        if (!HasClass(new_atom)) *classes_.find(old_atom) = new_atom;
        classes_.erase_if([&](Atom other) { return other == old_atom; });
    }
    OnClassesChanged();
    AnnounceClassChange(old_value);
    return true;
}

// The joined value is made for those who ask for it only: toggling a class is the hottest change of a page.
std::optional<Atom> Element::ClassValueForObservers() const {
    const bool wanted = (GetDocument()->mutationObserverKinds & kMutationAttributes) != 0;
    return wanted && Is(kHasClasses) ? std::optional<Atom>(GetClassName()) : std::nullopt;
}

void Element::AnnounceClassChange(std::optional<Atom> old_value) {
    AttributeChanged({atoms::kClass, false}, old_value, std::nullopt);
}

RefPtr<DOMTokenList> Element::GetClassList() {
    // One list for each element that is asked: pages that toggle classes in every frame make no objects.
    RefPtr<DOMTokenList>& list = EnsureRareData().class_list;
    if (!list) list = script::MakeHandle<DOMTokenList>(*this);
    return list;
}

// --- style

css::StyleDeclarationSet& Element::EnsureInlineStyle() {
    if (!inline_style_) inline_style_ = MakeUnique<css::StyleDeclarationSet, MemoryTag::DOM>();
    return *inline_style_;
}

css::StyleDeclarationSet& Element::EnsureExtraStyle() {
    auto& extra = EnsureRareData().extra_style;
    if (!extra) extra = MakeUnique<css::StyleDeclarationSet, MemoryTag::DOM>();
    return *extra;
}

void Element::SetInlineStyleText(std::string_view text) {
    Document& document = *GetDocument();
    const css::ParserContextPtr syntax = css::ParseInlineStyle(text);
    EnsureInlineStyle() = css::ConvertInlineStyle(*syntax, document.GetURLText(), document.GetStrings());
    MarkStyleDirty();
}

}  // namespace qorvex::dom
