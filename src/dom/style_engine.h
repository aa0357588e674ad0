// The style side of one document, as the tree sees it: who depends on what, and the queries by selector.
// Implemented in css/style. It lives as long as its document.
#pragma once

#include <memory>
#include <string_view>

#include "core/memory/containers.h"
#include "core/memory/string_pool.h"
#include "qsl/ref_ptr.h"

namespace qorvex::css {
struct LayoutStyleRefs;
class MediaFeatures;
struct Stylesheet;
}  // namespace qorvex::css

namespace qorvex::dom {

class Document;
class Element;
class Node;

class IStyleEngine {
  public:
    virtual ~IStyleEngine() = default;

    // The groups that a new node shares. Stays at one address for the life of the document.
    virtual const css::LayoutStyleRefs& GetDefaultStyle() const = 0;

    // Adds the rules of a sheet behind those already there. `media` is the text of a link's media attribute,
    // empty when there is none. The engine requests the full solve itself.
    virtual void AddStyleSheet(Document& document, Element* owner, qsl::RefPtr<css::Stylesheet> sheet,
                               std::string_view media) = 0;
    virtual void RemoveStyleSheet(Document& document, Element* owner) = 0;

    // The frame's style step: matches, solves and fills the change lists of the document.
    virtual void SolveStyles(Document& document) = 0;
    // The viewport or root font changed: media groups may move and viewport units resolve anew.
    virtual void OnMetricsChanged(Document& document) = 0;

    // Does any selector depend on this attribute? `data` attributes come without their "data-".
    virtual bool IsSelectorAttribute(Atom name) const = 0;
    virtual bool IsSelectorDataAttribute(Atom name) const = 0;
    // Counts of rules with any combinator, and with "+" or "~".
    virtual uint32_t SubtreeInvalidatingRules() const = 0;
    virtual uint32_t SiblingInvalidatingRules() const = 0;

    // Queries. A bad selector is logged by the engine and matches nothing.
    virtual bool Matches(Element& element, std::string_view selector) = 0;
    virtual Element* Closest(Element& element, std::string_view selector) = 0;
    virtual Element* QuerySelector(Node& root, std::string_view selector) = 0;
    virtual void QuerySelectorAll(Node& root, std::string_view selector,
                                  Vector<Element*, MemoryTag::DOM>& matches) = 0;
};

}  // namespace qorvex::dom
