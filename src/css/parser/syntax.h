// The short-lived syntax tree of one parse: plain records in the arena, chained in source order. Texts point
// into the arena or into the parsed text, which the arena holds a copy of.
#pragma once

#include <cstdint>
#include <string_view>

#include "css/parser/selector.h"

namespace qorvex::css {

// Appending is constant time, and so is joining.
template <class T>
class SyntaxList {
  public:
    class Iterator {
      public:
        explicit Iterator(const T* item) : item_(item) {}
        const T& operator*() const { return *item_; }
        const T* operator->() const { return item_; }
        Iterator& operator++() {
            item_ = item_->next;
            return *this;
        }
        friend bool operator==(const Iterator&, const Iterator&) = default;

      private:
        const T* item_;
    };

    void Append(T* item) {
        item->next = nullptr;
        (last_ ? last_->next : first_) = item;
        last_ = item;
        ++size_;
    }
    bool empty() const { return first_ == nullptr; }
    uint32_t size() const { return size_; }
    const T& front() const { return *first_; }
    const T& back() const { return *last_; }
    Iterator begin() const { return Iterator(first_); }
    Iterator end() const { return Iterator(nullptr); }

  private:
    T* first_ = nullptr;
    T* last_ = nullptr;
    uint32_t size_ = 0;
};

enum class SimpleSelectorSyntaxKind : uint8_t {
    Class = 0,
    Universal = 1,
    Id = 2,
    Type = 3,
    PseudoClass = 4,
    PseudoElement = 5,
    Attribute = 6,
};

struct SimpleSelectorSyntax {
    SimpleSelectorSyntax* next = nullptr;
    SimpleSelectorSyntaxKind kind = SimpleSelectorSyntaxKind::Universal;
    AttributeOperator op = AttributeOperator::Presence;
    std::string_view text;      // the name, without "." "#" ":" or "("
    std::string_view value;     // of an attribute, as written: quotes stay
    std::string_view flag;      // of an attribute
    std::string_view argument;  // of a functional pseudo-class
};

struct CompoundSyntax {
    CompoundSyntax* next = nullptr;
    Combinator combinator =
        Combinator::Descendant;  // to the compound before it; of the first one meaningless
    SyntaxList<SimpleSelectorSyntax> simple;
};

struct SelectorSyntax {
    SelectorSyntax* next = nullptr;
    SyntaxList<CompoundSyntax> compounds;  // from left to right
};

struct DeclarationSyntax {
    DeclarationSyntax* next = nullptr;
    std::string_view name;
    std::string_view value;  // normalised: one space between terms, none around "," "/" and operators
    uint8_t flags = 0;       // DeclarationFlags
};

struct RulesetSyntax {
    RulesetSyntax* next = nullptr;
    SyntaxList<SelectorSyntax> selectors;
    SyntaxList<DeclarationSyntax> declarations;
};

struct MediaExpressionSyntax {
    MediaExpressionSyntax* next = nullptr;
    std::string_view name;
    std::string_view value;
};

struct MediaQuerySyntax {
    MediaQuerySyntax* next = nullptr;
    SyntaxList<MediaExpressionSyntax> expressions;
};

struct MediaSyntax {
    MediaSyntax* next = nullptr;
    SyntaxList<MediaQuerySyntax> queries;
    SyntaxList<RulesetSyntax> rulesets;
};

struct KeyframeSelectorSyntax {
    KeyframeSelectorSyntax* next = nullptr;
    std::string_view text;
};

struct KeyframeBlockSyntax {
    KeyframeBlockSyntax* next = nullptr;
    SyntaxList<KeyframeSelectorSyntax> selectors;
    SyntaxList<DeclarationSyntax> declarations;
};

struct KeyframesSyntax {
    KeyframesSyntax* next = nullptr;
    std::string_view name;
    SyntaxList<KeyframeBlockSyntax> blocks;
};

struct FontFaceSyntax {
    FontFaceSyntax* next = nullptr;
    SyntaxList<DeclarationSyntax> declarations;
};

}  // namespace qorvex::css
