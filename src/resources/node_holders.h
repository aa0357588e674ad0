// The nodes that use one cached thing, with the number of their uses. Nodes are held weakly and told by tasks
// of their views; the pointers that serve as keys are compared and never followed.
//
// The owner's lock guards it. Nodes come in and go out on the main thread.
#pragma once

#include "core/memory/containers.h"
#include "core/tasks/task_system.h"
#include "dom/document.h"
#include "dom/document_host.h"
#include "script/scripting_handle_enabled.h"

namespace qorvex {

class NodeHolders {
  public:
    struct Holder {
        script::WeakHandle<dom::Node> node;
        const dom::Document* document = nullptr;
        TaskFamilyHandle family;
        uint32_t uses = 0;
        uint32_t serial = 0;  // tells it from a later holder for the same node
    };
    using Table = HashMap<const dom::Node*, Holder, MemoryTag::Resources>;

    bool IsEmpty() const { return holders_.empty(); }
    const Table& GetAll() const { return holders_; }
    // Any whose node lives, or null.
    const script::WeakHandle<dom::Node>* FindLiving() const {
        for (const auto& [key, holder] : holders_)
            if (holder.node) return &holder.node;
        return nullptr;
    }
    uint32_t CountUses() const {
        uint32_t uses = 0;
        for (const auto& [node, holder] : holders_)
            uses += holder.uses;
        return uses;
    }

    // `serial` differs for each call.
    void Add(dom::Node& node, uint32_t serial) {
        Holder& holder = holders_[&node];
        if (holder.uses++ > 0) return;
        dom::Document& document = *node.GetDocument();
        holder.node = script::WeakHandle<dom::Node>(&node);
        holder.document = &document;
        holder.family = document.GetHost().GetTaskFamily();
        holder.serial = serial;
    }
    // True when that was the node's last use.
    bool Remove(const dom::Node& node) {
        Holder* holder = holders_.get(&node);
        if (!holder || --holder->uses > 0) return false;
        holders_.erase(&node);
        return true;
    }
    // False when it had none.
    bool RemoveAllOf(const dom::Document& document) {
        Vector<const dom::Node*, MemoryTag::Resources> nodes;
        for (const auto& [node, holder] : holders_)
            if (holder.document == &document) nodes.push_back(node);
        for (const dom::Node* node : nodes)
            holders_.erase(node);
        return !nodes.empty();
    }
    bool HasOthersThan(const dom::Document& document) const {
        for (const auto& [node, holder] : holders_)
            if (holder.document != &document) return true;
        return false;
    }
    // A node may have let go and asked again since a task was made for it; it was told of everything then.
    bool Holds(const dom::Node& node, uint32_t serial) const {
        const Holder* holder = holders_.get(&node);
        return holder && holder->serial == serial;
    }

  private:
    Table holders_;
};

}  // namespace qorvex
