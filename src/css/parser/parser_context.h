// Parsing in two steps: text to a short-lived syntax tree (ParserContext), and that to records (convert.h). A
// context is used by one thread; any number of threads may parse at once.
#pragma once

#include <cstdint>
#include <string_view>

#include "css/parser/arena.h"
#include "css/parser/syntax.h"
#include "css/values/shared_value.h"

namespace qorvex::css {

namespace parser {

// The results of a parse. Lists are in source order; after an error they hold what stood before it.
class IContext {
  public:
    virtual const SyntaxList<RulesetSyntax>& GetRulesets() const = 0;
    virtual const SyntaxList<MediaSyntax>& GetMediaBlocks() const = 0;
    virtual const SyntaxList<KeyframesSyntax>& GetKeyframes() const = 0;
    virtual const SyntaxList<FontFaceSyntax>& GetFontFaces() const = 0;
    virtual bool HasError() const = 0;

  protected:
    virtual ~IContext() = default;
};

}  // namespace parser

// Invariant: everything in the lists lies in the arena or in the text copied into it, and dies with the
// context.
class ParserContext final : public SharedValue<ParserContext>, public parser::IContext {
  public:
    explicit ParserContext(size_t arenaChunkSize) : arena_(arenaChunkSize) {}
    ~ParserContext() override = default;

    const SyntaxList<RulesetSyntax>& GetRulesets() const override { return rulesets_; }
    const SyntaxList<MediaSyntax>& GetMediaBlocks() const override { return mediaBlocks_; }
    const SyntaxList<KeyframesSyntax>& GetKeyframes() const override { return keyframes_; }
    const SyntaxList<FontFaceSyntax>& GetFontFaces() const override { return fontFaces_; }
    bool HasError() const override { return hasError_; }
    // Rules that were read at the top level, with an empty block or not.
    uint32_t GetRuleCount() const { return ruleCount_; }
    // How many tokens were read: the measure of work that tests hold against the text's length.
    uint64_t GetTokenCount() const { return tokenCount_; }

    ParserArena& arena() { return arena_; }

  private:
    friend class Grammar;

    ParserArena arena_;
    SyntaxList<RulesetSyntax> rulesets_;
    SyntaxList<MediaSyntax> mediaBlocks_;
    SyntaxList<KeyframesSyntax> keyframes_;
    SyntaxList<FontFaceSyntax> fontFaces_;
    uint32_t ruleCount_ = 0;
    uint64_t tokenCount_ = 0;
    bool hasError_ = false;
};

using ParserContextPtr = RefPtr<ParserContext>;

// A whole sheet; a UTF-8 byte order mark is skipped. The text need not outlive the call.
[[nodiscard]] ParserContextPtr ParseStylesheet(std::string_view text);
// The text of a style attribute.
[[nodiscard]] ParserContextPtr ParseInlineStyle(std::string_view text);
// The text of a media attribute.
[[nodiscard]] ParserContextPtr ParseMediaQuery(std::string_view text);
// A selector list, for script queries.
[[nodiscard]] ParserContextPtr ParseSelector(std::string_view text);

}  // namespace qorvex::css
