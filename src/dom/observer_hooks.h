// Seats for those who watch the tree. Each is one pointer or byte on the document that is empty while nobody
// watches, so that a mutation costs one test.
#pragma once

#include <optional>
#include <span>

#include "core/memory/string_pool.h"
#include "qsl/ref_ptr.h"

namespace qorvex::dom {

class CharacterData;
class Element;
class Node;

// Told of every node that leaves the document (animations, SVG animations).
class INodeLifetimeObserver {
  public:
    virtual ~INodeLifetimeObserver() = default;
    virtual void OnNodeRemoved(Node& node) = 0;
};

// Bits of Document::mutationObserverKinds.
enum MutationKinds : uint8_t { kMutationChildList = 1, kMutationAttributes = 2, kMutationCharacterData = 4 };

struct ChildListChange {
    std::span<const qsl::RefPtr<Node>> added;
    std::span<const qsl::RefPtr<Node>> removed;
    Node* previous_sibling = nullptr;  // as they stood around the place before the change
    Node* next_sibling = nullptr;
};

// Called only while the matching bit of mutationObserverKinds is set.
class IMutationRegistry {
  public:
    virtual ~IMutationRegistry() = default;
    virtual void QueueChildList(Node& target, const ChildListChange& change) = 0;
    virtual void QueueAttribute(Element& target, Atom name, std::optional<Atom> old_value) = 0;
    virtual void QueueCharacterData(CharacterData& target, std::string_view old_text) = 0;
    // A subtree is about to leave `parent`: observers of the parent's chain go on seeing it until delivery.
    virtual void AddTransientObservers(Node& removed, Node& parent) = 0;
};

// The developer tools.
class IDomInspector {
  public:
    virtual ~IDomInspector() = default;
    virtual void OnChildListChanged(Node& parent) = 0;
    virtual void OnNodeArrived(Node& node) = 0;
    virtual void OnNodeLeft(Node& parent, Node& node) = 0;
    virtual void OnAttributeSet(Element& element, std::string_view name, std::string_view value) = 0;
    virtual void OnAttributeRemoved(Element& element, std::string_view name) = 0;
    virtual void OnCharacterDataChanged(CharacterData& node) = 0;
};

// Data binding reads data- attributes of elements in the document.
class IDataBindingScanner {
  public:
    virtual ~IDataBindingScanner() = default;
    virtual void OnDataAttribute(Element& element, Atom name, Atom value) = 0;
    virtual void OnElementRemoved(Element& element) = 0;
    virtual void OnDOMReady() = 0;
};

// Custom elements: what happened to them is told to their definitions at certain points only.
class ICustomElementReactions {
  public:
    virtual ~ICustomElementReactions() = default;
    virtual void Flush() = 0;
};

}  // namespace qorvex::dom
