// Finding elements. The caches are answers kept until a change could show in them: by id for the whole
// document, by tag and class for each root that was asked.

#include "core/logging/log.h"
#include "core/memory/atoms.h"
#include "dom/ascii.h"
#include "dom/document.h"
#include "dom/node_list.h"
#include "script/make_handle.h"

namespace qorvex::dom {

using qsl::RefPtr;

// --- By id. Every connected element with an id is counted under it; which one comes first in document order
// is known while there is one, and found again after a change among several.

Element* Document::GetElementById(std::string_view id) {
    if (id.empty()) {
        // The empty id is that of every element without one.
        for (Node* node = GetNextInTree(this); node; node = node->GetNextInTree(this))
            if (node->IsElement() && !node->Is(kHasId)) return static_cast<Element*>(node);
        return nullptr;
    }
    const Atom atom = FindAtom(id);
    if (atom.empty()) return nullptr;
    IdEntry* entry = ids_.get(atom);
    if (!entry) return nullptr;
    if (!entry->first) entry->first = FindById(atom);
    return entry->first;
}

Element* Document::FindById(Atom id) {
    for (Node* node = GetNextInTree(this); node; node = node->GetNextInTree(this))
        if (node->IsElement() && static_cast<Element*>(node)->GetId() == id)
            return static_cast<Element*>(node);
    return nullptr;
}

void Document::AddId(Element& element, Atom id) {
    if (id.empty()) return;
    IdEntry& entry = ids_[id];
    entry.first = ++entry.count == 1 ? &element : nullptr;
}

void Document::RemoveId(Element& element, Atom id) {
    if (id.empty()) return;
    IdEntry* entry = ids_.get(id);
    if (!entry) return;
    if (--entry->count == 0) {
        ids_.erase(id);
    } else if (entry->first == &element) {
        entry->first = nullptr;
    }
}

void Document::OnIdChanged(Element& element, Atom old_id) {
    RemoveId(element, old_id);
    AddId(element, element.GetId());
}

// --- By tag and class. Only connected roots are cached: nobody tells of changes in a detached tree.

void Document::ForgetCollections(Node& node) {
    if (collections_.empty()) return;
    for (const Node* root = &node; root; root = root->GetParent())
        collections_.erase(root);
}

void Document::ForgetClassCollections(Node& node) {
    if (collections_.empty()) return;
    for (const Node* root = &node; root; root = root->GetParent())
        if (Collections* cached = collections_.get(root)) cached->by_class.clear();
}

namespace {

template <class Predicate>
RefPtr<HTMLCollection> Collect(Node& root, Predicate&& wanted) {
    RefPtr<HTMLCollection> list = script::MakeHandle<HTMLCollection>();
    for (Node* node = root.GetNextInTree(&root); node; node = node->GetNextInTree(&root))
        if (node->IsElement() && wanted(static_cast<Element&>(*node))) list->Add(*node);
    return list;
}

template <class Map, class Key, class Predicate>
RefPtr<HTMLCollection> CollectCached(Map& map, Key key, Node& root, Predicate&& wanted) {
    if (RefPtr<HTMLCollection>* cached = map.get(key)) return *cached;
    RefPtr<HTMLCollection> list = Collect(root, wanted);
    map.insert(key, list);
    return list;
}

}  // namespace

RefPtr<HTMLCollection> Document::GetElementsByTagName(Node& root, std::string_view name) {
    if (name.empty()) return script::MakeHandle<HTMLCollection>();
    NodeText upper;
    for (const char c : name)
        upper.push_back(ToAsciiUpper(c));
    const css::TagId tag = css::TagLookup(upper);
    if (tag == css::TagId::Unknown) {
        LogDebug("Invalid tag name in getElementsByTagName -> ", name);
        return script::MakeHandle<HTMLCollection>();
    }
    if (tag == css::TagId::Custom) {
        return Collect(root, [&](Element& element) {
            return element.GetTag() == tag && EqualsIgnoringAsciiCase(element.GetMarkupName().view(), name);
        });
    }
    const auto wanted = [&](Element& element) { return tag == css::TagId::Any || element.GetTag() == tag; };
    if (!root.IsInDocument()) return Collect(root, wanted);
    return CollectCached(collections_[&root].by_tag, tag, root, wanted);
}

RefPtr<HTMLCollection> Document::GetElementsByClassName(Node& root, std::string_view name) {
    const Atom atom = name.empty() ? Atom() : FindAtom(name);
    if (atom.empty()) return script::MakeHandle<HTMLCollection>();
    const auto wanted = [&](Element& element) { return element.HasClass(atom); };
    if (!root.IsInDocument()) return Collect(root, wanted);
    return CollectCached(collections_[&root].by_class, atom, root, wanted);
}

RefPtr<HTMLCollection> Document::GetElementsByName(std::string_view name) {
    const Atom atom = name.empty() ? Atom() : FindAtom(name);
    if (atom.empty()) return script::MakeHandle<HTMLCollection>();
    return Collect(*this, [&](Element& element) {
        const Atom* value = element.FindAttribute(atoms::kName);
        return value && *value == atom;
    });
}

}  // namespace qorvex::dom
