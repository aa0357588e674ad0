// One parsed declaration: a longhand, where its value comes from, and the value record itself.
//
// Invariant: the property and the kind tell what the 20 bytes of room hold. A plain value of a small,
// trivially copyable type lies in them; any other value, and every custom expression, is an object of its own
// behind an owned pointer there, which the top bit of the kind byte says. Copying, comparing and destroying
// go through one table indexed by property.
#pragma once

#include <cstdint>
#include <cstring>
#include <string_view>
#include <type_traits>
#include <utility>

#include "css/values/custom_property.h"
#include "css/values/property_id.h"
#include "css/values/property_traits.h"

namespace qorvex::css {

enum class DeclarationKind : uint8_t { Value = 0, Inherit = 1, CustomExpression = 2 };

inline constexpr size_t kDeclarationRoom = 20;

template <class T>
inline constexpr bool kInlineValue =
    sizeof(T) <= kDeclarationRoom &&
    alignof(T) <= 4 && std::is_trivially_copyable_v<T>&& std::is_trivially_destructible_v<T>;

class Declaration {
  public:
    using TriviallyRelocatable = Declaration;

    Declaration() = default;
    Declaration(const Declaration& other);
    Declaration(Declaration&& other) noexcept { TakeFrom(other); }
    Declaration& operator=(const Declaration& other);
    Declaration& operator=(Declaration&& other) noexcept;
    ~Declaration() {
        if (OwnsPointer()) Destroy();
    }

    template <PropertyId id>
    static Declaration Make(typename PropertyTraits<id>::Type value, uint8_t flags = 0) {
        Declaration made;
        made.SetValue<id>(std::move(value));
        made.flags_ = flags;
        return made;
    }
    static Declaration Inherit(PropertyId id, uint8_t flags = 0);
    static Declaration Expression(PropertyId id, CustomExpression expression, uint8_t flags);
    // The property's initial value as a plain value.
    static Declaration Initial(PropertyId id, uint8_t flags = 0);

    // The same value for another longhand of the same value type.
    Declaration WithProperty(PropertyId id) const {
        Declaration copy(*this);
        copy.property_ = id;
        return copy;
    }

    PropertyId property() const { return property_; }
    DeclarationKind kind() const { return static_cast<DeclarationKind>(kind_ & ~kOwnsPointer); }
    uint8_t flags() const { return flags_; }
    void set_flags(uint8_t flags) { flags_ = flags; }
    bool important() const { return (flags_ & kImportant) != 0; }
    bool IsValue() const { return kind() == DeclarationKind::Value && property_ != PropertyId::kUnknown; }

    // Only for a plain value of that property.
    template <PropertyId id>
    const typename PropertyTraits<id>::Type& Get() const {
        return As<typename PropertyTraits<id>::Type>();
    }
    // Only for a plain value of that type.
    template <class T>
    const T& As() const {
        if constexpr (kInlineValue<T>)
            return *reinterpret_cast<const T*>(room_);
        else
            return *static_cast<const T*>(pointer());
    }
    // Only of kind CustomExpression.
    const CustomExpression& expression() const { return *static_cast<const CustomExpression*>(pointer()); }

    // Where the plain value lies, for code that goes through the operations table.
    const void* value() const { return OwnsPointer() ? pointer() : room_; }

    // Replaces what was there by a plain value; the flags stay.
    template <PropertyId id>
    void SetValue(typename PropertyTraits<id>::Type value) {
        using T = typename PropertyTraits<id>::Type;
        if (OwnsPointer()) Destroy();
        property_ = id;
        kind_ = static_cast<uint8_t>(DeclarationKind::Value);
        if constexpr (kInlineValue<T>)
            new (room_) T(value);
        else
            SetPointer(New<T, MemoryTag::CSS>(std::move(value)));
    }

    // Same property, kind, flags and value.
    friend bool operator==(const Declaration& a, const Declaration& b);

  private:
    static constexpr uint8_t kOwnsPointer = 0x80;

    bool OwnsPointer() const { return (kind_ & kOwnsPointer) != 0; }
    void* pointer() const {
        void* object;
        std::memcpy(&object, room_, sizeof object);
        return object;
    }
    void SetPointer(void* object) {
        std::memcpy(room_, &object, sizeof object);
        kind_ |= kOwnsPointer;
    }
    void TakeFrom(Declaration& other) noexcept {
        std::memcpy(static_cast<void*>(this), &other, sizeof other);
        other.kind_ &= ~kOwnsPointer;
        other.property_ = PropertyId::kUnknown;
    }
    void Destroy();

    PropertyId property_ = PropertyId::kUnknown;
    uint8_t kind_ = 0;  // DeclarationKind, and kOwnsPointer
    uint8_t flags_ = 0;
    alignas(4) unsigned char room_[kDeclarationRoom] = {};
};

static_assert(sizeof(Declaration) == 24);

}  // namespace qorvex::css
