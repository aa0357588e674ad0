// An interned string, of pointer size: atoms of one pool with the same text are the same pointer, and so are
// the engine's constants (atoms.h) in every pool. An atom lives as long as its pool; a constant always.
#pragma once

#include <cstdint>
#include <string_view>

#include "qsl/hash.h"

namespace qorvex {

struct AtomEntry {
    const char* text;  ///< Ends with a zero.
    uint32_t length;
};

class Atom {
  public:
    constexpr Atom() = default;
    constexpr explicit Atom(const AtomEntry* entry) : entry_(entry) {}

    constexpr bool empty() const { return !entry_; }
    constexpr explicit operator bool() const { return entry_; }
    constexpr std::string_view view() const {
        return entry_ ? std::string_view(entry_->text, entry_->length) : std::string_view();
    }
    constexpr const char* c_str() const { return entry_ ? entry_->text : ""; }
    constexpr size_t size() const { return entry_ ? entry_->length : 0; }
    constexpr const AtomEntry* entry() const { return entry_; }
    uint64_t HashValue() const { return qsl::HashPointer(entry_); }

    friend constexpr bool operator==(Atom a, Atom b) { return a.entry_ == b.entry_; }

  private:
    const AtomEntry* entry_ = nullptr;
};
static_assert(sizeof(Atom) == sizeof(void*));

}  // namespace qorvex
