#include "css/style/default_sheet.h"

namespace qorvex::css {
namespace {

// The initial display is block, so only what differs from a block is told here. Elements without a picture of
// their own stay out of the layout; phrasing tags are inline; headings, emphasis, lists and quotes get the
// usual sizes, weights and margins of the HTML standard's rendering section in moderation (there are no
// markers, tables or rules to draw). A generic family on the root is what brings the game's own default font
// to pages that name none. Every selector is a single tag, which the rule index finds without matching.
constexpr std::string_view kText = R"css(
head, style, script, title, meta, link, base, template, noscript, param, source, track, datalist { display: none }

a, abbr, acronym, b, bdi, bdo, big, cite, code, del, dfn, em, font, i, ins, kbd, label, mark, output, q, rb, rp, rt,
rtc, ruby, s, samp, small, span, strike, strong, sub, sup, time, tt, u, var, br, wbr, nobr { display: inline }

html { font-family: sans-serif }
body { margin: 8px }
p, blockquote, figure, dl, ol, ul, menu, dir, pre, listing, xmp { margin-top: 1em; margin-bottom: 1em }
blockquote, figure { margin-left: 40px; margin-right: 40px }
dd { margin-left: 40px }
ol, ul, menu, dir { padding-left: 40px }
fieldset { margin-left: 2px; margin-right: 2px; border: 1px solid #808080; padding: 6px 12px }

h1 { font-size: 2em; margin-top: 0.67em; margin-bottom: 0.67em; font-weight: bold }
h2 { font-size: 1.5em; margin-top: 0.83em; margin-bottom: 0.83em; font-weight: bold }
h3 { font-size: 1.17em; margin-top: 1em; margin-bottom: 1em; font-weight: bold }
h4 { margin-top: 1.33em; margin-bottom: 1.33em; font-weight: bold }
h5 { font-size: 0.83em; margin-top: 1.67em; margin-bottom: 1.67em; font-weight: bold }
h6 { font-size: 0.67em; margin-top: 2.33em; margin-bottom: 2.33em; font-weight: bold }

b, strong, th, dt { font-weight: bold }
i, em, cite, var, dfn, address { font-style: italic }
big { font-size: 1.2em }
small, sub, sup { font-size: 0.83em }
code, kbd, samp, tt, pre, listing, xmp { font-family: monospace }
pre, listing, xmp, textarea { white-space: pre }
center, caption { text-align: center }
mark { background-color: #ffff00; color: #000000 }

hr { margin-top: 0.5em; margin-bottom: 0.5em; border-top: 1px solid #808080 }
a, button, select { cursor: pointer }
button { text-align: center }
)css";

}  // namespace

std::string_view DefaultSheetText() {
    return kText;
}

}  // namespace qorvex::css
