// The pool of interned strings that the document and the style system compare by pointer. Strings are never
// freed before the pool goes. The engine's constants are entered first, without copying, so an atom can be
// compared with atoms::kName by pointer in any pool. All operations may be called from any thread.
#pragma once

#include <string_view>

#include "core/memory/atom.h"
#include "core/memory/chained_atom_set.h"
#include "core/memory/containers.h"
#include "qsl/mutex.h"

namespace qorvex {

class StringPool {
  public:
    StringPool();
    ~StringPool();
    StringPool(const StringPool&) = delete;
    StringPool& operator=(const StringPool&) = delete;

    /// The atom of the text; the empty text gives the empty atom. With `copy` false the text itself is
    /// entered: it must end with a zero and outlive the pool.
    Atom Intern(std::string_view text, bool copy = true);
    /// The atom of the text if it has one, else the empty atom.
    Atom Find(std::string_view text) const;
    /// Strings in the pool.
    size_t size() const;

  private:
    struct Block {
        std::byte* memory;
        size_t used;
        size_t capacity;
    };
    std::byte* Bump(size_t size, size_t alignment) QSL_REQUIRES(mutex_);

    mutable qsl::Mutex mutex_;
    Vector<Block> blocks_ QSL_GUARDED_BY(mutex_);
    ChainedAtomSet atoms_ QSL_GUARDED_BY(mutex_);
};

}  // namespace qorvex
