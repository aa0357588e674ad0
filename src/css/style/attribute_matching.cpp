#include "css/style/attribute_matching.h"

#include <optional>

#include "core/memory/atoms.h"
#include "core/memory/temp_vector.h"
#include "dom/element.h"

namespace qorvex::css {
namespace {

char ToLower(char c) {
    return c >= 'A' && c <= 'Z' ? static_cast<char>(c + 32) : c;
}

bool SameText(std::string_view a, std::string_view b, bool ignoreCase) {
    if (a.size() != b.size()) return false;
    if (!ignoreCase) return a == b;
    for (size_t i = 0; i < a.size(); ++i) {
        if (ToLower(a[i]) != ToLower(b[i])) return false;
    }
    return true;
}

// Knuth, Morris and Pratt: linear in both lengths.
size_t FindInLong(std::string_view text, std::string_view part, bool ignoreCase) {
    const auto same = [ignoreCase](char a, char b) { return ignoreCase ? ToLower(a) == ToLower(b) : a == b; };
    const TempMark mark;
    TempVector<uint32_t> borders;  // of each beginning of the part: how much of it is its own end
    borders.resize(static_cast<uint32_t>(part.size()));
    uint32_t matched = 0;
    const auto step = [&](char c) {
        while (matched > 0 && !same(part[matched], c))
            matched = borders[matched - 1];
        if (same(part[matched], c)) ++matched;
    };
    for (uint32_t i = 1; i < part.size(); ++i) {
        step(part[i]);
        borders[i] = matched;
    }
    matched = 0;
    for (size_t i = 0; i < text.size(); ++i) {
        step(text[i]);
        if (matched == part.size()) return i + 1 - matched;
    }
    return std::string_view::npos;
}

size_t Find(std::string_view text, std::string_view part, bool ignoreCase) {
    if (part.size() > text.size()) return std::string_view::npos;
    // The page decides on both lengths, so their product is no bound on the work.
    constexpr size_t kLong = 64;
    if (part.size() > kLong) return FindInLong(text, part, ignoreCase);
    if (!ignoreCase) return text.find(part);
    for (size_t i = 0; i + part.size() <= text.size(); ++i) {
        if (SameText(text.substr(i, part.size()), part, true)) return i;
    }
    return std::string_view::npos;
}

// Only the first occurrence is examined.
bool IncludesWord(std::string_view text, std::string_view word, bool ignoreCase) {
    const size_t at = Find(text, word, ignoreCase);
    if (at == std::string_view::npos) return false;
    const size_t end = at + word.size();
    return (at == 0 || text[at - 1] == ' ') && (end == text.size() || text[end] == ' ');
}

// Looser than Selectors Level 4, 6.1: the part may begin anywhere. Only the first occurrence is examined.
bool EndsBeforeDash(std::string_view text, std::string_view part, bool ignoreCase) {
    const size_t at = Find(text, part, ignoreCase);
    if (at == std::string_view::npos) return false;
    const size_t end = at + part.size();
    return end == text.size() || text[end] == '-';
}

bool Compare(const SimpleSelector& simple, std::string_view text) {
    const std::string_view value = simple.value.view();
    switch (simple.op) {
        case AttributeOperator::Presence:
            return true;
        case AttributeOperator::Equals:
            return SameText(text, value, simple.ignoreCase);
        case AttributeOperator::Includes:
            return !value.empty() && IncludesWord(text, value, simple.ignoreCase);
        case AttributeOperator::DashMatch:
            return EndsBeforeDash(text, value, simple.ignoreCase);
        // An empty value matches nothing (Selectors Level 4, 6.2).
        case AttributeOperator::Prefix:
            return !value.empty() && SameText(text.substr(0, value.size()), value, simple.ignoreCase);
        case AttributeOperator::Suffix:
            return !value.empty() && text.size() >= value.size() &&
                   SameText(text.substr(text.size() - value.size()), value, simple.ignoreCase);
        case AttributeOperator::Substring:
            return !value.empty() && Find(text, value, simple.ignoreCase) != std::string_view::npos;
    }
    return false;
}

// id, class and style are attributes to a selector although the element keeps them in fields of their own.
std::optional<std::string_view> FindStoredApart(Atom name, const dom::Element& element, dom::NodeText& room) {
    if (name != atoms::kId && name != atoms::kClass && name != atoms::kStyle) return std::nullopt;
    return element.GetAttributeText(name.view(), room);
}

}  // namespace

bool MatchAttribute(const SimpleSelector& simple, const dom::Element& element) {
    const Atom* stored =
        simple.isData ? element.FindDataAttribute(simple.name) : element.FindAttribute(simple.name);
    if (stored) {
        if (simple.op == AttributeOperator::Equals && !simple.ignoreCase) return *stored == simple.value;
        return Compare(simple, stored->view());
    }
    if (simple.isData) return false;
    dom::NodeText room;
    const std::optional<std::string_view> apart = FindStoredApart(simple.name, element, room);
    return apart && Compare(simple, *apart);
}

}  // namespace qorvex::css
