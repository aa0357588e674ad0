#include "css/style/property_solver.h"

#include "css/style/property_appliers.h"
#include "css/style/root_propagation.h"
#include "css/values/animated_properties.h"
#include "css/values/value_text.h"
#include "dom/change_mask.h"

namespace qorvex::css {

// CSS Values and Units, 4.4 and CSS Inheritance: a relative length is made absolute where it is declared, so
// that descendants inherit pixels and nothing compounds. The same goes for relative weights.
const void* PropertySolver::FromParent(PropertyId id) {
    const TextLayoutStyle& text = *in_.parent.text;
    switch (id) {
        case PropertyId::FontSize:
            return &(inheritedLength_ = Length::Pixels(text.computedFontSize));
        case PropertyId::TextStrokeWidth:
            return &(inheritedLength_ = Length::Pixels(text.computedStrokeWidth));
        case PropertyId::FontWeight:
            return &(inheritedWeight_ = static_cast<FontWeight>(text.computedFontWeight / 100));
        case PropertyId::LetterSpacing:
            inheritedSpacing_ = text.letterSpacing;
            if (inheritedSpacing_.kind == SpacingKind::Length)
                inheritedSpacing_.length = Length::Pixels(text.computedLetterSpacing);
            return &inheritedSpacing_;
        case PropertyId::LineHeight:
            inheritedLineHeight_ = text.lineHeight;
            // A plain number is a length in em and stays one: it multiplies the heir's own font size.
            if (text.lineHeight.kind == SpacingKind::Length && text.lineHeight.length.unit != LengthUnit::Em)
                inheritedLineHeight_.length = Length::Pixels(text.computedLineHeight);
            return &inheritedLineHeight_;
        default:
            break;
    }
    const void* propagated = in_.parentRoot ? in_.parentRoot->Find(in_.parentIsHtml, id) : nullptr;
    return propagated ? propagated : in_.parent.Field(id);
}

const void* PropertySolver::FromCascade(PropertyId id, ValueSource& source) {
    source = ValueSource::Declaration;
    if (const Declaration* found = in_.match.Find(id)) {
        const Declaration& declaration = *found;
        switch (declaration.kind()) {
            case DeclarationKind::Value:
                return declaration.value();
            case DeclarationKind::Inherit:
                return FromParent(id);
            case DeclarationKind::CustomExpression:
                if (EvaluateCustomExpression(declaration, in_.style, in_.expressions, evaluated_))
                    return evaluated_.kind() == DeclarationKind::Inherit ? FromParent(id)
                                                                         : evaluated_.value();
                source = ValueSource::Initial;
                return DefaultStyles().Field(id);
        }
    }
    if (kInheritedProperties.Contains(id)) {
        source = ValueSource::Inherited;
        return FromParent(id);
    }
    source = ValueSource::Initial;
    return DefaultStyles().Field(id);
}

const void* PropertySolver::Compute(PropertyId id, ValueSource& source) {
    if (in_.animated && in_.animated->IsActive(id)) {
        if (auto* slotOf = kPropertyAppliers[IndexOf(id)].animatedSlot) {
            source = ValueSource::Animation;
            return slotOf(const_cast<AnimatedValues&>(in_.animated->present));
        }
    }
    return FromCascade(id, source);
}

// Notes where the cascade now wants the transition to end, and shows where it stands.
const void* PropertySolver::ThroughTransition(PropertyId id, const void* value, ValueSource& source,
                                              uint32_t& mask) {
    const PropertyApplier& applier = kPropertyAppliers[IndexOf(id)];
    source = ValueSource::Transition;
    if (!applier.animatedSlot) return value;
    void* target = applier.animatedSlot(in_.transition->targets);
    if (!OperationsOf(id).equal(target, value)) {
        applier.assign(target, value);
        in_.transition->changed.Add(id);
        mask |= dom::kChangeTransitionTarget;
    }
    return in_.firstSolve ? value : applier.animatedSlot(in_.transition->present);
}

ValueSource PropertySolver::Apply(PropertyId id, uint32_t& mask) {
    ++counters_.propertiesApplied;
    ValueSource source;
    const void* value = Compute(id, source);
    if (in_.transition && in_.transition->IsActive(id) && source != ValueSource::Animation)
        value = ThroughTransition(id, value, source, mask);
    const PropertyApplier& applier = kPropertyAppliers[IndexOf(id)];
    if (!applier.store(in_.style, value)) return ValueSource::Unchanged;
    ++counters_.propertiesChanged;
    mask |= applier.changeMask;
    return source;
}

}  // namespace qorvex::css
