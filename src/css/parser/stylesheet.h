// A parsed sheet. Read-only once converted, apart from its count: the stylesheet cache and any number of
// documents of one System may hold it. Copying a sheet copies selectors and shares declarations.
#pragma once

#include "css/parser/media_feature.h"
#include "css/parser/selector.h"
#include "css/values/declaration.h"
#include "css/values/keywords.h"
#include "css/values/shared_value.h"

namespace qorvex::css {

// What stands between the braces of a rule: declarations in source order with shorthands expanded, and custom
// properties by name without "--".
struct DeclarationBlock : SharedValue<DeclarationBlock> {
    CssVector<Declaration> declarations;
    CustomPropertyMap customProperties;

    bool empty() const { return declarations.empty() && customProperties.empty(); }
};

// One selector with its declarations. The selectors of one CSS rule each make a Ruleset; they behave as if
// each had its own copy of the block, which they share until one is changed: a list of N selectors over M
// declarations must not cost N times M.
class Ruleset {
  public:
    Ruleset() = default;
    Ruleset(ComplexSelector selector, RefPtr<DeclarationBlock> block)
        : selector(std::move(selector)), block_(std::move(block)) {}

    ComplexSelector selector;

    const CssVector<Declaration>& declarations() const { return block_->declarations; }
    const CustomPropertyMap& customProperties() const { return block_->customProperties; }
    // For editing; elements matched to this rule must be re-matched.
    DeclarationBlock& MutableBlock() {
        if (!block_->HasOneRef()) block_ = MakeRef<DeclarationBlock>(*block_);
        return *block_;
    }

  private:
    RefPtr<DeclarationBlock> block_;
};

struct MediaBlock {
    MediaFeatureList features;
    CssVector<Ruleset> rules;
};

struct FontFace {
    CssString family;
    CssString url;  // resolved against the sheet's URL where that was possible
    int32_t weight = 400;
    FontStyle style = FontStyle::Normal;
};

// One property of a @keyframes rule: plain values and custom expressions by offset, in source order.
struct KeyframeTrack {
    struct Frame {
        float offset = 0;
        Declaration value;
    };
    PropertyId property = PropertyId::kUnknown;
    CssVector<Frame> frames;
};

struct KeyframesRule {
    CssString name;
    CssVector<KeyframeTrack> tracks;
};

struct Stylesheet : SharedValue<Stylesheet> {
    HashSet<CssString, MemoryTag::CSS> imageUrls;  // absolute where the sheet's URL is known
    CssVector<Ruleset> rules;
    CssVector<MediaBlock> mediaBlocks;
    CssVector<FontFace> fontFaces;
    CssVector<KeyframesRule> keyframes;
};

using StylesheetPtr = RefPtr<Stylesheet>;

}  // namespace qorvex::css
