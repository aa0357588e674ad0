// The tags that elements and selectors know, by number. Ids 0 to 149 are the HTML parser library's tag
// enumeration in its order (dom/ asserts that); the table lies this low because selectors are converted
// without a document.
#pragma once

#include <cstddef>
#include <cstdint>
#include <string_view>

// T(Name, "TEXT"): the text is what nodeName answers.
// clang-format off
#define QORVEX_HTML_TAGS(T) \
    T(Html, "HTML") T(Head, "HEAD") T(Title, "TITLE") T(Base, "BASE") T(Link, "LINK") T(Meta, "META") \
    T(Style, "STYLE") T(Script, "SCRIPT") T(NoScript, "NOSCRIPT") T(Template, "TEMPLATE") T(Body, "BODY") \
    T(Article, "ARTICLE") T(Section, "SECTION") T(Nav, "NAV") T(Aside, "ASIDE") T(H1, "H1") T(H2, "H2") \
    T(H3, "H3") T(H4, "H4") T(H5, "H5") T(H6, "H6") T(HGroup, "HGROUP") T(Header, "HEADER") \
    T(Footer, "FOOTER") T(Address, "ADDRESS") T(P, "P") T(Hr, "HR") T(Pre, "PRE") \
    T(BlockQuote, "BLOCKQUOTE") T(Ol, "OL") T(Ul, "UL") T(Li, "LI") T(Dl, "DL") T(Dt, "DT") T(Dd, "DD") \
    T(Figure, "FIGURE") T(FigCaption, "FIGCAPTION") T(Main, "MAIN") T(Div, "DIV") T(A, "A") T(Em, "EM") \
    T(Strong, "STRONG") T(Small, "SMALL") T(S, "S") T(Cite, "CITE") T(Q, "Q") T(Dfn, "DFN") T(Abbr, "ABBR") \
    T(Data, "DATA") T(Time, "TIME") T(Code, "CODE") T(Var, "VAR") T(Samp, "SAMP") T(Kbd, "KBD") \
    T(Sub, "SUB") \
    T(Sup, "SUP") T(I, "I") T(B, "B") T(U, "U") T(Mark, "MARK") T(Ruby, "RUBY") T(Rt, "RT") T(Rp, "RP") \
    T(Bdi, "BDI") T(Bdo, "BDO") T(Span, "SPAN") T(Br, "BR") T(Wbr, "WBR") T(Ins, "INS") T(Del, "DEL") \
    T(Image, "IMAGE") T(Img, "IMG") T(IFrame, "IFRAME") T(Embed, "EMBED") T(Object, "OBJECT") \
    T(Param, "PARAM") T(Video, "VIDEO") T(Audio, "AUDIO") T(Source, "SOURCE") T(Track, "TRACK") \
    T(Canvas, "CANVAS") T(Map, "MAP") T(Area, "AREA") T(Math, "MATH") T(Mi, "MI") T(Mo, "MO") T(Mn, "MN") \
    T(Ms, "MS") T(MText, "MTEXT") T(MGlyph, "MGLYPH") T(MAlignMark, "MALIGNMARK") \
    T(AnnotationXml, "ANNOTATION_XML") T(Svg, "SVG") T(ForeignObject, "FOREIGNOBJECT") T(Desc, "DESC") \
    T(Table, "TABLE") T(Caption, "CAPTION") T(ColGroup, "COLGROUP") T(Col, "COL") T(TBody, "TBODY") \
    T(THead, "THEAD") T(TFoot, "TFOOT") T(Tr, "TR") T(Td, "TD") T(Th, "TH") T(Form, "FORM") \
    T(FieldSet, "FIELDSET") T(Legend, "LEGEND") T(Label, "LABEL") T(Input, "INPUT") T(Button, "BUTTON") \
    T(Select, "SELECT") T(DataList, "DATALIST") T(OptGroup, "OPTGROUP") T(Option, "OPTION") \
    T(TextArea, "TEXTAREA") T(KeyGen, "KEYGEN") T(Output, "OUTPUT") T(Progress, "PROGRESS") \
    T(Meter, "METER") T(Details, "DETAILS") T(Summary, "SUMMARY") T(Menu, "MENU") T(MenuItem, "MENUITEM") \
    T(Applet, "APPLET") T(Acronym, "ACRONYM") T(BgSound, "BGSOUND") T(Dir, "DIR") T(Frame, "FRAME") \
    T(FrameSet, "FRAMESET") T(NoFrames, "NOFRAMES") T(IsIndex, "ISINDEX") T(Listing, "LISTING") \
    T(Xmp, "XMP") \
    T(NextId, "NEXTID") T(NoEmbed, "NOEMBED") T(PlainText, "PLAINTEXT") T(Rb, "RB") T(Strike, "STRIKE") \
    T(BaseFont, "BASEFONT") T(Big, "BIG") T(Blink, "BLINK") T(Center, "CENTER") T(Font, "FONT") \
    T(Marquee, "MARQUEE") T(MultiCol, "MULTICOL") T(Nobr, "NOBR") T(Spacer, "SPACER") T(Tt, "TT") \
    T(Rtc, "RTC") T(Unknown, "<unknown>") T(Any, "*") T(Custom, "<custom>")
// clang-format on

namespace qorvex::css {

enum class TagId : uint8_t {
#define QORVEX_TAG(name, text) name,
    QORVEX_HTML_TAGS(QORVEX_TAG)
#undef QORVEX_TAG
};

inline constexpr size_t kTagCount = static_cast<size_t>(TagId::Custom) + 1;
static_assert(static_cast<int>(TagId::Unknown) == 150 && kTagCount == 153);

// Upper-case name to id. A name that is not in the table is Custom when it holds a "-", else Unknown.
[[nodiscard]] TagId TagLookup(std::string_view upperCaseName);
// "<unknown>" out of range.
[[nodiscard]] std::string_view TagName(TagId tag);

}  // namespace qorvex::css
