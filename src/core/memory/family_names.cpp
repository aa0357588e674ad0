#include "core/memory/family_names.h"

#include <cstring>

#include "core/limits.h"
#include "core/logging/log.h"
#include "core/memory/chained_atom_set.h"
#include "qsl/mutex.h"

namespace qorvex {
namespace {

class FamilyNames {
  public:
    ~FamilyNames() {
        for (Name* name : names_)
            Delete<MemoryTag::General>(name);
    }

    const char* Intern(std::string_view text) {
        const uint64_t hash = HashInterned(text);
        qsl::MutexLock lock(mutex_);
        if (const AtomEntry* known = set_.Find(text, hash)) return known->text;
        if (text.size() + 1 > sizeof(store_) - used_) return nullptr;
        char* copy = store_ + used_;
        if (!text.empty()) std::memcpy(copy, text.data(), text.size());
        copy[text.size()] = '\0';
        used_ += text.size() + 1;
        Name* name = names_.emplace_back(New<Name, MemoryTag::General>());
        name->entry = {copy, static_cast<uint32_t>(text.size())};
        name->node = {nullptr, static_cast<uint32_t>(hash), 0, &name->entry};
        set_.Insert(&name->node);
        return copy;
    }

    const char* default_family = nullptr;

  private:
    struct Name {
        AtomEntry entry;
        ChainedAtomSet::Node node;
    };
    static constexpr uint32_t kFirstBuckets = 16;

    qsl::Mutex mutex_;
    ChainedAtomSet set_ QSL_GUARDED_BY(mutex_){kFirstBuckets};
    Vector<Name*> names_ QSL_GUARDED_BY(mutex_);
    size_t used_ QSL_GUARDED_BY(mutex_) = 0;
    char store_[limits::kFamilyNameBytes] QSL_GUARDED_BY(mutex_);
};

constinit FamilyNames* g_family_names = nullptr;

}  // namespace

void StartFamilyNames(std::string_view default_family) {
    StopFamilyNames();
    g_family_names = New<FamilyNames, MemoryTag::General>();
    g_family_names->default_family = g_family_names->Intern(default_family);
}

void StopFamilyNames() {
    Delete<MemoryTag::General>(std::exchange(g_family_names, nullptr));
}

const char* InternFamilyName(std::string_view name) {
    if (!g_family_names) {
        AssertFailure("Font family names are used outside the life of the library!");
        return nullptr;
    }
    return g_family_names->Intern(name);
}

const char* GetDefaultFamilyName() {
    return g_family_names ? g_family_names->default_family : nullptr;
}

}  // namespace qorvex
