#include "css/parser/parser_context.h"

#include "css/parser/grammar.h"

namespace qorvex::css {

namespace {

constexpr size_t kSmallTextChunk = 1024;
constexpr size_t kSheetChunk = 16384;

// The arena keeps the text, which the tree points into.
ParserContextPtr ParseWrapped(std::string_view before, std::string_view text, std::string_view after,
                              size_t chunkSize) {
    ParserContextPtr context = MakeRef<ParserContext>(chunkSize);
    size_t size = before.size() + text.size() + after.size();
    char* whole = static_cast<char*>(context->arena().Allocate(size + 1, 1));
    char* end = whole;
    for (std::string_view piece : {before, text, after})
        end = std::copy(piece.begin(), piece.end(), end);
    *end = '\0';
    Grammar({whole, size}, *context).ParseSheet();
    return context;
}

}  // namespace

ParserContextPtr ParseStylesheet(std::string_view text) {
    if (text.starts_with("\xEF\xBB\xBF")) text.remove_prefix(3);
    return ParseWrapped({}, text, {}, std::max(text.size() / 8, kSheetChunk));
}

ParserContextPtr ParseInlineStyle(std::string_view text) {
    return ParseWrapped("* { ", text, " }\n", kSmallTextChunk);
}

ParserContextPtr ParseMediaQuery(std::string_view text) {
    return ParseWrapped("@media ", text, "{ div { dummy: style; } }\n", kSmallTextChunk);
}

ParserContextPtr ParseSelector(std::string_view text) {
    return ParseWrapped({}, text, "{ display:block }", kSmallTextChunk);
}

}  // namespace qorvex::css
