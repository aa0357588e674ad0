// Paths that painting needs again, by the numbers that they are made from.
#pragma once

#include "display/lru_cache.h"
#include "qsl/ref_ptr.h"

#include <fresco/path.h>

namespace qorvex::dsp {

using PathPtr = qsl::RefPtr<fresco::Path>;

class PathCache {
  public:
    static constexpr uint32_t kDefaultCapacity = 64;

    uint32_t Size() const { return cache_.Size(); }
    uint32_t Capacity() const { return cache_.Capacity(); }
    void SetCapacity(uint32_t capacity) {
        cache_.SetCapacity(capacity, [](const PathPtr&) {});
    }
    void Clear() {
        cache_.Clear([](const PathPtr&) {});
    }

    // The path under the key, which `build(Path&)` fills when it is not there. Null without memory.
    template <typename Build>
    PathPtr Get(std::string_view key, Build&& build) {
        if (PathPtr* found = cache_.Find(key)) return *found;
        PathPtr path = qsl::AdoptRef(fresco::Path::Create());
        if (!path) return path;
        build(*path);
        cache_.Insert(key, path, [](const PathPtr&) {});
        return path;
    }

  private:
    LruCache<PathPtr> cache_{kDefaultCapacity};
};

}  // namespace qorvex::dsp
