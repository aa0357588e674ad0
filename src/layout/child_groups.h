// Bounds of neighbouring children, so that one changed child of ten thousand costs the look at a few groups
// and not at all its siblings.
#pragma once

#include "core/memory/containers.h"
#include "layout/geometry.h"

#include <algorithm>
#include <array>

namespace qorvex::layout {

// What some children and all below them add up to.
struct ChildSum {
    Rect content{};  // their aabb together, document coordinates
    Rect visual{};   // view coordinates
    // One of them, or a plain node below, is positioned or a stacking context: not all paint in tree order.
    bool layered = false;

    void Add(const ChildSum& other) {
        content = Union(content, other.content);
        visual = Union(visual, other.visual);
        layered = layered || other.layered;
    }
};

// A group of the lowest level sums up kFanout children, one of the next level kFanout groups, and so on.
// Nodes with no more children than that have no groups.
class ChildGroups {
  public:
    static constexpr uint32_t kFanout = 16;

    void Clear() { children_ = 0; }
    // False when there are groups for another number of children.
    bool Fit(uint32_t children) const { return children_ == children; }
    // Forgets all sums.
    void Resize(uint32_t children) {
        children_ = children;
        levels_ = 0;
        uint32_t total = 0;
        for (uint32_t count = children; count > kFanout;) {
            count = (count + kFanout - 1) / kFanout;
            starts_[levels_++] = total;
            total += count;
        }
        starts_[levels_] = total;
        groups_.clear();
        groups_.resize(total);
    }
    // False when every group of the child was marked already.
    bool MarkDirty(uint32_t child) {
        if (child >= children_) return false;
        bool any = false;
        uint32_t place = child;
        for (uint32_t level = 0; level < levels_; ++level) {
            place /= kFanout;
            bool& dirty = groups_[starts_[level] + place].dirty;
            any = any || !dirty;
            dirty = true;
        }
        return any;
    }

    // Calls add(index, sum) for the children of dirty groups, or of all, and gives the sum of everything.
    template <typename AddChild>
    ChildSum Update(bool all, AddChild&& add) {
        return levels_ == 0 ? ChildSum() : UpdateLevel(levels_ - 1, 0, CountOf(levels_ - 1), all, add);
    }

    // Calls visit(index) for the children of groups to which enter(sum) says yes, in order.
    template <typename Enter, typename Visit>
    void Walk(Enter&& enter, Visit&& visit) const {
        if (levels_ > 0) WalkLevel(levels_ - 1, 0, CountOf(levels_ - 1), enter, visit);
    }

  private:
    struct Group : ChildSum {
        bool dirty = true;
    };
    static constexpr uint32_t kMostLevels = 8;  // 16 to the power of 8 are all that 32 bits count

    uint32_t CountOf(uint32_t level) const { return starts_[level + 1] - starts_[level]; }
    // What lies below a group: children below the lowest level.
    uint32_t EndBelow(uint32_t level, uint32_t group) const {
        return std::min((group + 1) * kFanout, level == 0 ? children_ : CountOf(level - 1));
    }

    template <typename AddChild>
    ChildSum UpdateLevel(uint32_t level, uint32_t begin, uint32_t end, bool all, AddChild& add) {
        ChildSum sum;
        for (uint32_t i = begin; i < end; ++i) {
            Group& group = groups_[starts_[level] + i];
            if (all || group.dirty) {
                static_cast<ChildSum&>(group) = SumBelow(level, i, all, add);
                group.dirty = false;
            }
            sum.Add(group);
        }
        return sum;
    }
    template <typename AddChild>
    ChildSum SumBelow(uint32_t level, uint32_t group, bool all, AddChild& add) {
        const uint32_t end = EndBelow(level, group);
        if (level > 0) return UpdateLevel(level - 1, group * kFanout, end, all, add);
        ChildSum sum;
        for (uint32_t child = group * kFanout; child < end; ++child)
            add(child, sum);
        return sum;
    }
    template <typename Enter, typename Visit>
    void WalkLevel(uint32_t level, uint32_t begin, uint32_t end, Enter& enter, Visit& visit) const {
        for (uint32_t i = begin; i < end; ++i) {
            if (!enter(static_cast<const ChildSum&>(groups_[starts_[level] + i]))) continue;
            const uint32_t endBelow = EndBelow(level, i);
            if (level > 0) {
                WalkLevel(level - 1, i * kFanout, endBelow, enter, visit);
            } else {
                for (uint32_t child = i * kFanout; child < endBelow; ++child)
                    visit(child);
            }
        }
    }

    uint32_t children_ = 0;
    uint32_t levels_ = 0;
    std::array<uint32_t, kMostLevels + 1> starts_{};  // of each level in the list, and its end
    Vector<Group, MemoryTag::LayoutNodes> groups_;
};

// What a node with children knows of them.
struct ChildBounds {
    ChildSum sum;
    ScrollPosition appliedScroll;                           // under which their matrices were made
    UniquePtr<ChildGroups, MemoryTag::LayoutNodes> groups;  // of many children
};

}  // namespace qorvex::layout
