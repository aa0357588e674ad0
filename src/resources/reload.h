// Loading all of a cache again. Entries keep their ids, so that nodes need not learn new ones.
#pragma once

#include "core/url/url.h"
#include "resources/node_holders.h"

namespace qorvex {

struct Reload {
    uint32_t id;
    URL url;
    script::WeakHandle<dom::Node> node;  // in whose document it is asked for
};
using Reloads = Vector<Reload, MemoryTag::Resources>;

// The entries that a living node holds and that `restart` has taken back to their beginning; it returns false
// for those that are to stay as they are. Under the lock of the table.
template <class Entries, class Restart>
Reloads CollectReloads(Entries& entries, Restart restart) {
    Reloads reloads;
    for (auto& [id, entry] : entries) {
        const script::WeakHandle<dom::Node>* node = entry.holders.FindLiving();
        if (node && restart(entry)) reloads.push_back({id, entry.url, *node});
    }
    return reloads;
}

// Without the lock: a request may be answered at once.
template <class Load>
void StartReloads(const Reloads& reloads, Load load) {
    for (const Reload& reload : reloads)
        if (dom::Node* node = reload.node.get()) load(reload.id, reload.url, *node->GetDocument());
}

}  // namespace qorvex
