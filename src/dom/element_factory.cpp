#include "dom/element_factory.h"

#include <gumbo.h>

#include <array>

#include "dom/ascii.h"
#include "dom/document.h"
#include "dom/html_elements.h"
#include "dom/html_image_element.h"
#include "dom/html_link_element.h"
#include "dom/html_script_element.h"
#include "dom/html_style_element.h"
#include "script/make_handle.h"

namespace qorvex::dom {

using css::TagId;
using qsl::RefPtr;

namespace {

// The parser's tags are ours by number.
static_assert(static_cast<int>(TagId::Html) == GUMBO_TAG_HTML);
static_assert(static_cast<int>(TagId::Body) == GUMBO_TAG_BODY);
static_assert(static_cast<int>(TagId::Br) == GUMBO_TAG_BR);
static_assert(static_cast<int>(TagId::Script) == GUMBO_TAG_SCRIPT);
static_assert(static_cast<int>(TagId::Table) == GUMBO_TAG_TABLE);
static_assert(static_cast<int>(TagId::TextArea) == GUMBO_TAG_TEXTAREA);
static_assert(static_cast<int>(TagId::Rtc) == GUMBO_TAG_RTC);
static_assert(static_cast<int>(TagId::Unknown) == GUMBO_TAG_UNKNOWN);

using Maker = RefPtr<Element> (*)(Document& document, TagId tag);

template <class T>
RefPtr<Element> Make(Document& document, TagId tag) {
    return script::MakeHandle<T>(document, tag);
}

struct TagClass {
    TagId tag;
    Maker make;
};

// Tags with a class of their own.
constexpr TagClass kTagClasses[] = {
    {TagId::Html, Make<HTMLHtmlElement>},         {TagId::Head, Make<HTMLHeadElement>},
    {TagId::Title, Make<HTMLTitleElement>},       {TagId::Link, Make<HTMLLinkElement>},
    {TagId::Style, Make<HTMLStyleElement>},       {TagId::Script, Make<HTMLScriptElement>},
    {TagId::Body, Make<HTMLBodyElement>},         {TagId::P, Make<HTMLParagraphElement>},
    {TagId::Pre, Make<HTMLPreElement>},           {TagId::Div, Make<HTMLDivElement>},
    {TagId::Span, Make<HTMLSpanElement>},         {TagId::A, Make<DOM_A>},
    {TagId::Img, Make<HTMLImageElement>},         {TagId::Video, Make<HTMLVideoElement>},
    {TagId::Source, Make<HTMLSourceElement>},     {TagId::Canvas, Make<HTMLCanvasElement>},
    {TagId::Input, Make<HTMLInputElement>},       {TagId::Button, Make<HTMLButtonElement>},
    {TagId::TextArea, Make<HTMLTextAreaElement>}, {TagId::Unknown, Make<HTMLUnknownElement>},
};

constexpr std::array<Maker, css::kTagCount> MakeTable() {
    std::array<Maker, css::kTagCount> table{};
    for (Maker& make : table)
        make = Make<HTMLElement>;
    for (const TagClass& row : kTagClasses)
        table[static_cast<size_t>(row.tag)] = row.make;
    return table;
}
constexpr std::array<Maker, css::kTagCount> kMakers = MakeTable();

// The name of a tag that the parser does not know, from its source text: "<my-tag a=1>" gives "my-tag".
std::string_view NameFromSource(const GumboStringPiece& piece) {
    const std::string_view source(piece.data, piece.length);
    size_t start = 0;
    while (start < source.size() && !IsAsciiAlnum(source[start]))
        ++start;
    size_t end = start;
    while (end < source.size() && (IsAsciiAlnum(source[end]) || source[end] == '-'))
        ++end;
    return source.substr(start, end - start);
}

std::string_view FirstText(const GumboElement& element) {
    if (element.children.length == 0) return {};
    const auto* child = static_cast<const GumboNode*>(element.children.data[0]);
    const bool is_text = child->type == GUMBO_NODE_TEXT || child->type == GUMBO_NODE_WHITESPACE;
    return is_text ? std::string_view(child->v.text.text) : std::string_view();
}

}  // namespace

RefPtr<Element> CreateElementByTag(TagId tag, std::string_view name, Document& document) {
    if (tag == TagId::Custom) {
        NodeText lower;
        for (const char c : name)
            lower.push_back(ToAsciiLower(c));
        return script::MakeHandle<CustomElement>(document, document.Intern(lower));
    }
    if (tag == TagId::Any) tag = TagId::Unknown;
    return kMakers[static_cast<size_t>(tag)](document, tag);
}

RefPtr<Element> CreateElementByName(std::string_view name, Document& document) {
    NodeText upper;
    upper.reserve(name.size());
    for (const char c : name)
        upper.push_back(ToAsciiUpper(c));
    return CreateElementByTag(css::TagLookup(upper), name, document);
}

RefPtr<Element> CreateElementFromParser(const GumboInternalNode& node, Document& document) {
    const GumboElement& source = node.v.element;
    const auto tag = static_cast<TagId>(source.tag);
    if (tag == TagId::NoScript) return nullptr;
    if (tag >= TagId::Unknown) {
        const std::string_view name = NameFromSource(source.original_tag);
        const bool custom = name.find('-', 1) != std::string_view::npos;
        return CreateElementByTag(custom ? TagId::Custom : TagId::Unknown, name, document);
    }
    // The style attribute is parsed with the other attributes: once is enough, the result is the same.
    RefPtr<Element> element = CreateElementByTag(tag, {}, document);
    if (tag == TagId::Style) static_cast<HTMLStyleElement&>(*element).StartFromParser(FirstText(source));
    if (tag == TagId::Script && source.children.length > 0) {
        const auto* text = static_cast<const GumboNode*>(source.children.data[0]);
        static_cast<HTMLScriptElement&>(*element).SetSourcePosition(text->v.text.start_pos.line,
                                                                    text->v.text.start_pos.column);
    }
    return element;
}

}  // namespace qorvex::dom
