#include "css/style/element_solver.h"

#include "css/style/custom_property_inheritance.h"
#include "css/style/derived_text_values.h"
#include "css/style/property_appliers.h"
#include "css/values/animated_properties.h"

namespace qorvex::css {
namespace {

using dom::Element;

constexpr PropertySet Range(PropertyId first, PropertyId last) {
    PropertySet set;
    for (size_t id = IndexOf(first); id <= IndexOf(last); ++id)
        set.Add(static_cast<PropertyId>(id));
    return set;
}
constexpr PropertySet kTransitionGroup =
    Range(PropertyId::TransitionProperty, PropertyId::TransitionTimingFunction);
constexpr PropertySet kTextGroup = Range(PropertyId::Color, PropertyId::TextStrokeColor);

// Groups that most elements have as all others have them.
struct ResetGroup {
    PropertySet properties;
    bool (*isShared)(const LayoutStyleRefs& a, const LayoutStyleRefs& b);
};
template <class Group>
bool SharesGroup(const LayoutStyleRefs& a, const LayoutStyleRefs& b) {
    return a.Handle<Group>() == b.Handle<Group>();
}
constexpr ResetGroup kResetGroups[] = {
    {Range(PropertyId::Display, PropertyId::Contain), &SharesGroup<LayoutStyle>},
    {Range(PropertyId::BackgroundImage, PropertyId::CompositionId), &SharesGroup<VisualStyle>},
    {Range(PropertyId::Transform, PropertyId::PerspectiveOrigin), &SharesGroup<TransformStyle>},
    {Range(PropertyId::AnimationName, PropertyId::AnimationPlayState), &SharesGroup<AnimationStyle>},
    {kTransitionGroup, &SharesGroup<TransitionStyle>},
};

class ElementSolver {
  public:
    ElementSolver(Element& element, StyleRun& run)
        : element_(element),
          run_(run),
          parentNode_(static_cast<Element&>(*element.GetParent())),
          style_(element.GetStyle()),
          parent_(parentNode_.GetStyle()),
          match_(element.GetMatchState() ? *element.GetMatchState() : run.nothingMatched),
          dirty_(element.GetDirtyProperties()),
          isHtml_(&element == run.document.GetHtmlElement()),
          isBody_(&element == run.document.GetBodyElement()),
          wasDisplayed_(style_.layout->display != CSSDisplay::None) {}

    SolvedElement Run() {
        const bool isFirst = element_.timesSolved == 0;
        if (element_.timesSolved < 2) ++element_.timesSolved;
        const bool ownEmpty = dirty_.Empty();
        const bool animates = TakeAnimatedChanges();
        const bool inherits = InheritDirtiness();
        const bool reaches = isFirst || dirty_ == PropertySet::All() || newCustomProperties_ ||
                             ((isHtml_ || isBody_) && !dirty_.Empty());
        if (dirty_.Empty() && element_.styleSolved) return {0, reaches};

        ++run_.counters.elementsSolved;
        mask_ = dom::kChangeSolved;
        if (!element_.styleSolved) {
            element_.styleSolved = 1;
            mask_ |= dom::kChangeLayout;
        }
        if (animates && !inherits && ownEmpty) {
            ApplyAll(dirty_ & kAnimatableProperties);
            UpdateText();
        } else if (!TakeSharedStyle()) {
            FullPath();
        }
        if (run_.rootFontSizeChanged) mask_ |= dom::kChangeLayout;  // lengths in rem are resolved by layout
        CheckDisplay();
        return {mask_, reaches || mask_ != dom::kChangeSolved};
    }

  private:
    // What running animations and transitions wrote since the last solve.
    bool TakeAnimatedChanges() {
        bool any = false;
        for (AnimatedProperties* record :
             {element_.animatedProperties.get(),
              static_cast<AnimatedProperties*>(element_.transitionProperties.get())}) {
            if (!record || record->dirty.Empty()) continue;
            dirty_ |= record->dirty;
            record->dirty.Clear();
            any = true;
        }
        return any;
    }

    bool InheritDirtiness() {
        PropertySet added;
        // Above the root stand the initial values, which do not change.
        if (!parentNode_.Is(dom::kIsDocument)) {
            const PropertySet& parentDirty = parentNode_.GetDirtyProperties();
            if (!parentDirty.Empty()) {
                added = (parentDirty & kInheritedProperties & ~SetByItself()) |
                        (parentDirty & match_.inheriting());
                // A variable may hold the word inherit; inside calc(), an em is the parent's.
                const bool newEm = parentDirty.Contains(PropertyId::FontSize);
                added |= newEm ? match_.expressions() : parentDirty & match_.expressions();
            }
        }
        newCustomProperties_ = UpdateCustomProperties(style_, parent_, match_);
        if (newCustomProperties_ || run_.rootFontSizeChanged) added |= match_.expressions();
        if (run_.rootFontSizeChanged) added |= kDerivedTextInputs;
        dirty_ |= added;
        return !added.Empty();
    }

    // Declared, and the same whatever the parent has.
    PropertySet SetByItself() const { return match_.properties() & ~kDerivedTextInputs; }

    bool IsAnimated() const { return element_.animatedProperties || element_.transitionProperties; }

    // Only for elements all of whose properties are looked at: theirs is the cost that sharing saves.
    bool TakeSharedStyle() {
        if (dirty_ != PropertySet::All() || isHtml_ || isBody_ || IsAnimated() ||
            !match_.customProperties().empty())
            return false;
        sharingKey_ = StyleSharingTable::MakeKey(element_, parent_, IsLandmark(parentNode_));
        canShare_ = true;
        const StyleSharingTable::Entry* entry = run_.sharing.Find(sharingKey_, element_, parent_);
        if (!entry) return false;
        ++run_.counters.stylesShared;
        mask_ |= entry->changeMask;
        const LayoutStyleRefs& other = entry->element->GetStyle();
        NoteCompositionChange(*other.visual);
        // The other element may have had the same images before, and this one not.
        if (!(style_.visual == other.visual)) mask_ |= dom::kChangeImages;
        const bool newFont = !(style_.text == other.text);
        Take(other.layout);
        Take(other.visual);
        Take(other.text);
        Take(other.transform);
        Take(other.animation);
        Take(other.transition);
        // The fonts tell the first asker alone when a face arrives; each holder of the group must ask for
        // itself.
        if (newFont && run_.fonts && style_.text->typefaces.contains(kNoTypeface) &&
            UpdateTypefaces(element_, *run_.fonts))
            mask_ |= dom::kChangeLayout;
        return true;
    }

    template <class Group>
    void Take(const StyleHandle<Group>& group) {
        if (style_.Handle<Group>() == group) return;
        style_.Handle<Group>() = group;
        style_.written.Add(kGroupOf<Group>);
    }

    bool IsLandmark(const dom::Node& node) const {
        return &node == run_.document.GetHtmlElement() || &node == run_.document.GetBodyElement();
    }

    void FullPath() {
        const uint32_t maskBefore = std::exchange(mask_, 0);
        PropertySet properties = dirty_;
        if (isHtml_ || isBody_) properties &= ~kPropagatedProperties;
        const bool adopts = AdoptParentText();
        if (adopts) properties &= ~kTextGroup;
        if (!properties.Empty() && !IsAnimated()) LeaveOutInitialGroups(properties);
        // Transitions first: they decide how the others may change.
        ApplyAll(properties & kTransitionGroup);
        ApplyAll(properties & ~kTransitionGroup);
        if (!adopts) UpdateText();
        if ((isHtml_ || isBody_) && (dirty_.Intersects(kPropagatedProperties))) {
            const PropertyInputs inputs = MakeInputs();
            PropertySolver solver(inputs, run_.counters);
            run_.rootStyles.Record(isHtml_, solver);
        }
        if (canShare_) run_.sharing.Insert(sharingKey_, element_, mask_);
        mask_ |= maskBefore;
    }

    // A group for which nothing is declared, and which parent and element share with everybody, has its
    // initial values already, inherited ones included.
    void LeaveOutInitialGroups(PropertySet& properties) const {
        for (const ResetGroup& group : kResetGroups) {
            if (match_.properties().Intersects(group.properties)) continue;
            const bool inherits = group.properties.Intersects(kInheritedProperties);
            if (group.isShared(style_, DefaultStyles()) &&
                (!inherits || group.isShared(parent_, DefaultStyles())))
                properties &= ~group.properties;
        }
    }

    PropertyInputs MakeInputs() const {
        const dom::Element* html = run_.document.GetHtmlElement();
        PropertyInputs inputs{style_,
                              parent_,
                              match_,
                              ActiveOrNull(element_.animatedProperties.get()),
                              ActiveOrNull(element_.transitionProperties.get()),
                              element_.timesSolved < 2,
                              {&parent_, html ? &html->GetStyle() : nullptr, run_.metrics.vw, run_.metrics.vh,
                               &run_.document.GetURL()}};
        if (IsLandmark(parentNode_)) {
            inputs.parentRoot = &run_.rootStyles;
            inputs.parentIsHtml = &parentNode_ == html;
        }
        return inputs;
    }

    template <class Record>
    static Record* ActiveOrNull(Record* record) {
        return record && record->totalActive ? record : nullptr;
    }

    void ApplyAll(const PropertySet& properties) {
        if (properties.Empty()) return;
        const PropertyInputs inputs = MakeInputs();
        PropertySolver solver(inputs, run_.counters);
        CssString compositionBefore;
        if (properties.Contains(PropertyId::CompositionId))
            compositionBefore = style_.visual->compositionId.value;
        properties.ForEach([&](PropertyId id) { solver.Apply(id, mask_); });
        if (!compositionBefore.empty() && !(compositionBefore == style_.visual->compositionId.value))
            run_.document.AddRemovedCompositionId(compositionBefore);
    }

    void NoteCompositionChange(const VisualStyle& next) {
        const auto& old = style_.visual->compositionId;
        if (!old.empty() && !(old == next.compositionId)) run_.document.AddRemovedCompositionId(old.value);
    }

    // An element that says nothing about text has its parent's text style; sharing the group saves a copy in
    // each of its kind. Not where the parent has values of its own that are not inherited.
    bool AdoptParentText() {
        if (isHtml_ || !dirty_.Intersects(kTextGroup) || IsAnimated()) return false;
        if (match_.properties().Intersects(kTextGroup)) return false;
        if (!run_.textStep.IsInheritable(parent_.text)) return false;
        if (style_.text == parent_.text) return true;
        const PropertySet looked = dirty_ & kTextGroup;
        const TextStep::Change change = run_.textStep.OfElement(style_.text, parent_.text, looked);
        Take(parent_.text);
        run_.counters.propertiesApplied += static_cast<uint64_t>(looked.Count());
        run_.counters.propertiesChanged += change.properties;
        mask_ |= change.mask;
        return true;
    }

    void UpdateText() {
        const float sizeBefore = style_.text->computedFontSize;
        if (dirty_.Intersects(kDerivedTextInputs)) {
            LengthContext metrics = run_.metrics;
            // On the root a rem is the initial size (CSS Values and Units, 6.1.2).
            if (isHtml_) metrics.rem = DefaultStyles().text->computedFontSize;
            if (UpdateDerivedText(style_, parent_, metrics)) {
                mask_ |= dom::kChangeLayout;
                // What is declared in em follows the font size, and heirs get it in pixels.
                dirty_ |= kDerivedTextInputs;
            }
        }
        if (run_.fonts && dirty_.Intersects(kFontKeyInputs) && UpdateTypefaces(element_, *run_.fonts))
            mask_ |= dom::kChangeLayout;
        if (!isHtml_) return;
        run_.metrics.em = run_.metrics.rem = style_.text->computedFontSize;
        run_.rootFontSizeChanged |= sizeBefore != style_.text->computedFontSize;
    }

    void CheckDisplay() {
        if (!dirty_.Contains(PropertyId::Display)) return;
        const bool displayed = style_.layout->display != CSSDisplay::None;
        if (isHtml_) {
            // The root's handle carries the tree, so the tree is made anew around it.
            if (displayed != wasDisplayed_ && run_.document.IsLayoutTreeBuilt())
                run_.document.RequestLayoutTreeRebuild();
            return;
        }
        const bool inLayout = element_.Is(dom::kInLayoutTree);
        if (displayed == inLayout) return;
        mask_ |= dom::kChangeLayout | (displayed ? dom::kChangeEnteredLayout : dom::kChangeLeftLayout);
    }

    Element& element_;
    StyleRun& run_;
    Element& parentNode_;  // the document counts as one
    LayoutStyleRefs& style_;
    const LayoutStyleRefs& parent_;
    const MatchState& match_;
    PropertySet& dirty_;
    const bool isHtml_;
    const bool isBody_;
    const bool wasDisplayed_;
    uint32_t mask_ = 0;
    bool canShare_ = false;
    bool newCustomProperties_ = false;
    StyleSharingTable::Key sharingKey_;
};

}  // namespace

SolvedElement SolveElement(Element& element, StyleRun& run) {
    return ElementSolver(element, run).Run();
}

}  // namespace qorvex::css
