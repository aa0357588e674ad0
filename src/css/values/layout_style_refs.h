// The computed style of one node: handles to the shared groups. Embedded in DOM nodes and copied by both
// halves of a layout handle; a copy copies references, never style data.
#pragma once

#include <cstdint>
#include <utility>

#include "css/values/custom_property.h"
#include "css/values/declaration.h"
#include "css/values/style_groups.h"

namespace qorvex::css {

// Counted reference to a style group; null only in a LayoutStyleRefs that is not set up.
template <class Group>
class StyleHandle {
  public:
    using TriviallyRelocatable = StyleHandle;

    StyleHandle() = default;
    explicit StyleHandle(RefPtr<Group> group) : group_(std::move(group)) {}

    const Group* get() const { return group_.get(); }
    const Group* operator->() const { return group_.get(); }
    const Group& operator*() const { return *group_; }
    explicit operator bool() const { return static_cast<bool>(group_); }
    // By identity: equal handles share one group.
    friend bool operator==(const StyleHandle& a, const StyleHandle& b) { return a.group_ == b.group_; }

    // The group for writing: itself while nobody else holds it, else a copy that this handle moves to.
    Group& MakeMutable() {
        if (!group_->HasOneRef()) group_ = MakeRef<Group>(*group_);
        return *group_;
    }

  private:
    RefPtr<Group> group_;
};

// Extras of a node that few nodes need; owned by one LayoutStyleRefs and not copied with it.
struct RareStyle {
    // Custom expressions as evaluated for this element, at most one per property.
    CssVector<Declaration> evaluated;

    const Declaration* FindEvaluated(PropertyId id) const;
    Declaration& StoreEvaluated(Declaration declaration);
};

// A flag for each counted handle of a style.
class WrittenGroups {
  public:
    bool Has(StyleGroup group) const { return (bits_ >> static_cast<unsigned>(group)) & 1; }
    void Add(StyleGroup group) { bits_ |= static_cast<uint8_t>(1u << static_cast<unsigned>(group)); }
    void AddCustomProperties() { bits_ |= 1u << kStyleGroupCount; }
    void AddAll() { bits_ = (1u << (kStyleGroupCount + 1)) - 1; }
    void Clear() { bits_ = 0; }
    WrittenGroups& operator|=(WrittenGroups other) {
        bits_ |= other.bits_;
        return *this;
    }

  private:
    uint8_t bits_ = 0;
};

// What boxes and paint depend on, and all that the layout side keeps of a style.
struct LaidOutStyle {
    StyleHandle<LayoutStyle> layout;
    StyleHandle<VisualStyle> visual;
    StyleHandle<TextLayoutStyle> text;
    StyleHandle<TransformStyle> transform;
    // Set when a group is made private, cleared when layout has taken it over.
    WrittenGroups written;
};

struct LayoutStyleRefs : LaidOutStyle {
    // All handles null; a node starts as a copy of DefaultStyles().
    LayoutStyleRefs() = default;
    LayoutStyleRefs(const LayoutStyleRefs& other);
    LayoutStyleRefs(LayoutStyleRefs&&) noexcept = default;
    LayoutStyleRefs& operator=(const LayoutStyleRefs& other);
    LayoutStyleRefs& operator=(LayoutStyleRefs&&) noexcept = default;

    StyleHandle<AnimationStyle> animation;
    StyleHandle<TransitionStyle> transition;
    RefPtr<const SharedCustomProperties> customProperties;  // null: none in force
    UniquePtr<RareStyle, MemoryTag::CSS> rare;

    template <class Group>
    StyleHandle<Group>& Handle();
    template <class Group>
    const StyleHandle<Group>& Handle() const {
        return const_cast<LayoutStyleRefs*>(this)->Handle<Group>();
    }
    template <class Group>
    Group& Mutable();
    template <PropertyId id>
    const typename PropertyTraits<id>::Type& Get() const {
        return (*Handle<typename PropertyTraits<id>::Group>()).*PropertyTraits<id>::kField;
    }
    // For code that knows the property only at run time.
    const void* Field(PropertyId id) const;

    RareStyle& EnsureRare();
    bool SameGroups(const LayoutStyleRefs& other) const;
};

template <>
inline StyleHandle<LayoutStyle>& LayoutStyleRefs::Handle() {
    return layout;
}
template <>
inline StyleHandle<VisualStyle>& LayoutStyleRefs::Handle() {
    return visual;
}
template <>
inline StyleHandle<TextLayoutStyle>& LayoutStyleRefs::Handle() {
    return text;
}
template <>
inline StyleHandle<TransformStyle>& LayoutStyleRefs::Handle() {
    return transform;
}
template <>
inline StyleHandle<AnimationStyle>& LayoutStyleRefs::Handle() {
    return animation;
}
template <>
inline StyleHandle<TransitionStyle>& LayoutStyleRefs::Handle() {
    return transition;
}

template <class Group>
inline constexpr StyleGroup kGroupOf = StyleGroup::Layout;
template <>
inline constexpr StyleGroup kGroupOf<VisualStyle> = StyleGroup::Visual;
template <>
inline constexpr StyleGroup kGroupOf<TextLayoutStyle> = StyleGroup::TextLayout;
template <>
inline constexpr StyleGroup kGroupOf<TransformStyle> = StyleGroup::Transform;
template <>
inline constexpr StyleGroup kGroupOf<AnimationStyle> = StyleGroup::Animation;
template <>
inline constexpr StyleGroup kGroupOf<TransitionStyle> = StyleGroup::Transition;

template <class Group>
Group& LayoutStyleRefs::Mutable() {
    written.Add(kGroupOf<Group>);
    return Handle<Group>().MakeMutable();
}

// The groups with all initial values. Made by the library at start and freed at its end; nothing else creates
// styles before or after. DefaultStyles() must lie between the two.
void CreateDefaultStyles();
void DestroyDefaultStyles();
[[nodiscard]] const LayoutStyleRefs& DefaultStyles();

}  // namespace qorvex::css
