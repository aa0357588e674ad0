// A page with its expectations in it: an HTML file that starts with a comment of directives, one a line,
// carried out in order once the page has loaded.
//
//   view WxH                    size before loading (1000x500)
//   simple selectors            a game that switched the restyling of combinators off
//   file NAME ... end           a file beside the page, for links
//   expect SELECTOR { property: value; ... }   the computed style of the first match
//   same SELECTOR | SELECTOR    all longhands alike
//   feed SELECTOR               every longhand's text, set on a fresh sibling, gives the same style again
//   none SELECTOR               nothing matches
//   box SELECTOR | X Y W H      of the first match with an id: its place on the page
//   snapped SELECTOR | X Y W H  the same to whole pixels, of boxes that end between them
//   pixel X Y | RRGGBB          over white
//   js EXPRESSION | TEXT        what the page's script makes of it
//   script STATEMENTS           runs, then a frame
//   resize WxH                  and a frame
//   log LEVEL TEXT              must be logged; TEXT may end in "..." for any rest
//   nolog TEXT                  no line has this in it
//
// Every Warning, Error and Assert line that no directive tells of fails the case.
#pragma once

#include <string>
#include <utility>
#include <vector>

namespace qorvex::pages {

struct Directive {
    std::string name;
    std::string text;
    int line = 0;
};

struct PageCase {
    std::string html;
    std::vector<std::pair<std::string, std::string>> files;
    std::vector<Directive> directives;
    unsigned width = 1000;
    unsigned height = 500;
    bool complexSelectors = true;
};

[[nodiscard]] PageCase ReadPageCase(const std::string& path, bool (*isDirective)(const std::string& word));

std::string Trim(const std::string& text);
// At the first `separator` outside of double quotes, both sides trimmed; the second is empty without one.
std::pair<std::string, std::string> SplitAt(const std::string& text, char separator);

}  // namespace qorvex::pages
