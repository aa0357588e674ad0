#include "css/style/selector_queries.h"

#include "core/limits.h"
#include "core/logging/log.h"
#include "css/parser/convert.h"
#include "css/style/element_walk.h"
#include "css/style/selector_matching.h"
#include "dom/document.h"

namespace qorvex::css {

using dom::Element;
using dom::Node;

const SelectorQueries::SelectorList* SelectorQueries::Parse(std::string_view text,
                                                            std::string_view operation) {
    if (const SelectorList* known = cache_.get(text)) return known;
    const ParserContextPtr context = ParseSelector(text);
    std::optional<SelectorList> selectors = context ? ConvertSelector(*context, strings_) : std::nullopt;
    if (!selectors) {
        LogWarning("Invalid CSS selector (", text, ") in ", operation, "!");
        return nullptr;
    }
    if (cache_.size() >= limits::kCachedQueries) cache_.clear();
    return &cache_.insert_or_assign(CssString(text), std::move(*selectors)).first->second;
}

bool SelectorQueries::Matches(Element& element, std::string_view text) {
    const SelectorList* selectors = Parse(text, "Matches");
    if (!selectors) return false;
    const PseudoState pseudo(*element.GetDocument());
    MatchContext context(pseudo);
    for (const ComplexSelector& selector : *selectors) {
        if (MatchSelector(selector, element, context, false)) return true;
    }
    return false;
}

Element* SelectorQueries::Closest(Element& element, std::string_view text) {
    const SelectorList* selectors = Parse(text, "Matches");
    if (!selectors) return nullptr;
    const PseudoState pseudo(*element.GetDocument());
    MatchContext context(pseudo);
    for (Node* node = element.GetParent(); node && node->IsElement() && !node->Is(dom::kIsDocument);
         node = node->GetParent()) {
        auto& ancestor = static_cast<Element&>(*node);
        for (const ComplexSelector& selector : *selectors) {
            if (MatchSelector(selector, ancestor, context, false)) return &ancestor;
        }
    }
    return nullptr;
}

Element* SelectorQueries::QuerySelector(Node& root, std::string_view text) {
    const SelectorList* selectors = Parse(text, "QuerySelector");
    if (!selectors) return nullptr;
    const PseudoState pseudo(*root.GetDocument());
    MatchContext context(pseudo, &siblings_);
    Element* found = nullptr;
    for (const ComplexSelector& selector : *selectors) {
        ForEachElementBelow(root, [&](Element& element) {
            if (MatchSelector(selector, element, context, false)) found = &element;
            return !found;
        });
        if (found) break;
    }
    return found;
}

void SelectorQueries::QuerySelectorAll(Node& root, std::string_view text,
                                       Vector<Element*, MemoryTag::DOM>& matches) {
    const SelectorList* selectors = Parse(text, "QuerySelector");
    if (!selectors) return;
    const PseudoState pseudo(*root.GetDocument());
    MatchContext context(pseudo, &siblings_);
    for (const ComplexSelector& selector : *selectors) {
        ForEachElementBelow(root, [&](Element& element) {
            if (MatchSelector(selector, element, context, false)) matches.push_back(&element);
            return true;
        });
    }
}

}  // namespace qorvex::css
