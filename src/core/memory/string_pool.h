// The pool of interned strings that the document and the style system compare by pointer. No string is freed
// while anybody may hold its atom. The engine's constants are entered first, without copying, so an atom can
// be compared with atoms::kName by pointer in any pool. All operations may be called from any thread.
//
// A system has one pool and not each view its own: its views share the sheets of the stylesheet cache, whose
// selectors hold atoms, so what a view compares with them must come from the same pool. The price is that
// strings outlive the view that made them: they go when the system's last view has gone (ReleaseOthers).
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

    /// What is in the pool by now stays until the pool goes.
    void KeepSoFar();
    /// Frees all other strings: nobody holds an atom of one of them any more.
    void ReleaseOthers();

  private:
    struct Block {
        std::byte* memory;
        size_t used;
        size_t capacity;
    };
    struct Mark {
        size_t atoms = 0;
        uint32_t blocks = 0;
        size_t usedOfLast = 0;
    };
    Mark MarkHere() const QSL_REQUIRES(mutex_);
    std::byte* Bump(size_t size, size_t alignment) QSL_REQUIRES(mutex_);

    mutable qsl::Mutex mutex_;
    Vector<Block> blocks_ QSL_GUARDED_BY(mutex_);
    ChainedAtomSet atoms_ QSL_GUARDED_BY(mutex_);
    Mark kept_ QSL_GUARDED_BY(mutex_);
};

}  // namespace qorvex
