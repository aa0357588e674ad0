#include "css/values/declaration.h"

#include "css/values/value_text.h"

namespace qorvex::css {

Declaration::Declaration(const Declaration& other) {
    std::memcpy(static_cast<void*>(this), &other, sizeof other);
    if (!other.OwnsPointer()) return;
    if (other.kind() == DeclarationKind::CustomExpression)
        SetPointer(New<CustomExpression, MemoryTag::CSS>(other.expression()));
    else
        SetPointer(OperationsOf(property_).clone(other.pointer()));
}

Declaration& Declaration::operator=(const Declaration& other) {
    if (this != &other) *this = Declaration(other);
    return *this;
}

Declaration& Declaration::operator=(Declaration&& other) noexcept {
    if (this == &other) return *this;
    if (OwnsPointer()) Destroy();
    TakeFrom(other);
    return *this;
}

void Declaration::Destroy() {
    if (kind() == DeclarationKind::CustomExpression)
        Delete<MemoryTag::CSS>(static_cast<CustomExpression*>(pointer()));
    else
        OperationsOf(property_).destroy(pointer());
    kind_ &= static_cast<uint8_t>(~kOwnsPointer);
}

Declaration Declaration::Inherit(PropertyId id, uint8_t flags) {
    Declaration made;
    made.property_ = id;
    made.kind_ = static_cast<uint8_t>(DeclarationKind::Inherit);
    made.flags_ = flags;
    return made;
}

Declaration Declaration::Expression(PropertyId id, CustomExpression expression, uint8_t flags) {
    Declaration made;
    made.property_ = id;
    made.kind_ = static_cast<uint8_t>(DeclarationKind::CustomExpression);
    made.flags_ = flags;
    made.SetPointer(New<CustomExpression, MemoryTag::CSS>(std::move(expression)));
    return made;
}

Declaration Declaration::Initial(PropertyId id, uint8_t flags) {
    Declaration made;
    OperationsOf(id).setInitial(made);
    made.flags_ = flags;
    return made;
}

bool operator==(const Declaration& a, const Declaration& b) {
    if (a.property_ != b.property_ || a.kind() != b.kind() || a.flags_ != b.flags_) return false;
    if (a.kind() == DeclarationKind::CustomExpression) return a.expression() == b.expression();
    if (!a.IsValue()) return true;
    return OperationsOf(a.property_).equal(a.value(), b.value());
}

}  // namespace qorvex::css
