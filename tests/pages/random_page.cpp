#include "pages/random_page.h"

#include "support/image_files.h"

namespace qorvex::pages {

namespace {

struct Choices {
    const char* property;
    std::vector<const char*> values;
};

// "" takes the declaration away again.
const std::vector<Choices>& VisualStyles() {
    static const std::vector<Choices> kStyles = {
        {"background-color", {"rgba(200, 40, 30, 0.6)", "#2288cc", "#fff", ""}},
        {"background-image",
         {"linear-gradient(45deg, red, blue)", "radial-gradient(circle at 30% 40%, white, black 60%)",
          "repeating-linear-gradient(90deg, #0008 0 5px, transparent 5px 9px)",
          "linear-gradient(to right, lime, transparent), repeating-radial-gradient(#f00 0, #00f 7px)", ""}},
        {"background-size", {"20px 12px", "50% 30%", "cover", "auto"}},
        {"background-position", {"3px 5px", "right bottom", "50% 50%"}},
        {"background-repeat", {"repeat", "no-repeat", "round", "space", "repeat-x"}},
        {"border", {"3px solid black", "1px solid rgba(255, 255, 255, 0.5)", "2px dashed red", ""}},
        {"border-left", {"7px solid red", "0.5px solid blue", ""}},
        {"border-top-color", {"lime", "transparent", ""}},
        {"border-radius", {"9px", "50%", "20px 3px", "4px / 12px", ""}},
        {"border-image",
         {"linear-gradient(red, blue) 6 fill / 5px / 3px stretch",
          "radial-gradient(lime, black) 30% / 8px round", "linear-gradient(45deg, gold, teal) 4 / 4px repeat",
          ""}},
        {"box-shadow",
         {"3px 4px 6px 1px rgba(0, 0, 0, 0.7)", "inset 2px 2px 5px black, 0 0 0 3px green",
          "0 0 11px -2px blue, 9px -7px 0 2px rgba(255, 0, 0, 0.4)", "inset -3px 0 0 2px white", ""}},
        {"text-shadow", {"2px 3px 4px red", "-4px 1px 0 rgba(0, 0, 255, 0.6)", ""}},
        {"opacity", {"0.4", "1", "0", "0.999", ""}},
        {"visibility", {"hidden", "visible", ""}},
        {"filter",
         {"blur(3px)", "blur(0)", "drop-shadow(4px 3px 2px black)", "grayscale(0.7) brightness(1.2)",
          "hue-rotate(80deg) blur(1px)", ""}},
        {"mix-blend-mode", {"multiply", "difference", "screen", "normal", ""}},
        {"isolation", {"isolate", "auto"}},
        {"clip-path",
         {"circle(40%)", "inset(3px 5px round 4px)", "polygon(0 0, 100% 20%, 60% 100%)",
          "ellipse(30% 50% at 40% 40%)", ""}},
        {"mask-image",
         {"linear-gradient(black, transparent)", "radial-gradient(circle, black 40%, transparent 41%)", ""}},
        {"mask-size", {"12px 10px", "100% 100%", ""}},
        {"mask-repeat", {"repeat", "no-repeat", ""}},
        {"mask-position", {"4px 2px", "center", ""}},
        {"transform",
         {"rotate(20deg) scale(1.3)", "translateX(7.5px)", "skewX(15deg)", "rotateY(40deg) translateZ(5px)",
          "scale(0)", "scale(-1, 1)", "translate(30%, -10%)", "matrix(1, 0.2, 0.1, 0.8, 3, 2)", ""}},
        {"transform-origin", {"0 0", "100% 20%", ""}},
        {"transform-style", {"preserve-3d", "flat"}},
        {"perspective", {"80px", "300px", ""}},
        {"perspective-origin", {"0 0", "70% 20%", ""}},
        {"overflow", {"hidden", "scroll", "visible", ""}},
        {"z-index", {"-1", "0", "2", "auto"}},
        {"position", {"static", "relative", "absolute", "fixed"}},
        {"display", {"none", "flex", "block", ""}},
        {"color", {"red", "rgba(0, 0, 0, 0.5)", "black", "transparent"}},
        {"font-size", {"9px", "14px", "20px", ""}},
        {"font-style", {"italic", "normal"}},
        {"text-align", {"right", "center", "left"}},
        {"text-stroke", {"1px red", "0 black"}},
        {"text-transform", {"uppercase", "none"}},
        {"text-overflow", {"ellipsis", "clip"}},
        {"white-space", {"nowrap", "normal", "pre"}},
        {"letter-spacing", {"3px", "normal"}},
        {"line-height", {"11px", "1.8", ""}},
        {"user-select", {"none", "auto"}},
        {"padding", {"5px", "0", "2px 9px"}},
        {"margin", {"4px", "-6px", "0"}},
        {"flex-direction", {"column", "row-reverse", ""}},
        {"qor-composition-id", {"\"panel\"", "none"}},
    };
    return kStyles;
}

// Numbered pictures, then what loads in other ways; the animations come last.
constexpr uint32_t kPictures = 12;
const char* const kOtherPictures[] = {"missing.png", "broken.png", "slow.gif", "fast.gif"};
constexpr uint32_t kAnimations = 2;

const char* const kClasses[] = {"card", "glow", "glass", "tilt", "clip", "ink"};
const char* const kTexts[] = {"Ag", "wide words wrap in narrow boxes", "", "fi \xC3\xA9\xC3\x9F",
                              "1\\n2\\n3"};

std::string Quoted(const char* text) {
    return std::string("'") + text + "'";
}

}  // namespace

std::string RandomPage::Html() {
    return R"(<html><head><style>
html { background-color: #eee }
body { margin: 0; width: 160px; height: 120px; font-size: 11px }
.b { position: absolute; width: 40px; height: 30px; overflow-wrap: break-word }
.card { background-color: #fc8; border: 2px solid #640; border-radius: 6px }
.glow { box-shadow: 0 0 9px 2px #08f }
.glass { opacity: 0.7; background-color: #8cf8 }
.tilt { transform: rotate(-12deg) }
.clip { overflow: hidden; border-radius: 8px }
.clip > .b { left: 20px }
.ink { color: #a0f; text-shadow: 1px 1px 2px #000 }
</style></head><body id="b0"><div id="b1" class="b card" style="left: 20px; top: 10px"><div id="b2" class="b glow"
style="left: 10px; top: 8px">text</div></div><div id="b3" class="b clip" style="left: 80px; top: 10px"><div id="b4"
class="b card tilt" style="left: 5px; top: 5px"></div></div><div id="b5" class="b glass" style="left: 30px; top: 60px"
><p id="b6" qor-inline>in <span id="b7" class="ink">line</span> text</p></div><script>
function $(id) { return document.getElementById(id) }
function make(id) {
  const box = document.createElement(id % 7 == 3 ? 'img' : id % 5 ? 'div' : 'p')
  if (id % 7 == 3) box.setAttribute('src', 'p' + id % 12 + '.png')
  if (id % 10 == 0) box.setAttribute('qor-inline', '')
  box.id = 'b' + id
  box.className = id % 3 ? 'b' : ''
  if (id % 2) box.appendChild(document.createTextNode('t' + id))
  return box
}
function put(box, parent, before) {
  if (box && parent && !box.contains(parent) && box.id != 'b0')
    parent.insertBefore(box, before && before.parentNode == parent ? before : null)
}
function dump(node) {
  if (node.nodeType == 3) return node.data
  const below = []
  for (let i = 0; i < node.childNodes.length; ++i)
    if (node.childNodes[i].localName != 'script') below.push(dump(node.childNodes[i]))
  return [node.localName, node.id, node.className, node.getAttribute('style'), node.getAttribute('qor-inline'),
          node.getAttribute('src'), node.scrollLeft, node.scrollTop, below]
}
const scrolled = []
function build(record, parent) {
  if (typeof record == 'string') return parent.appendChild(document.createTextNode(record))
  const [tag, id, name, style, inline, source, left, top, below] = record
  const node = parent ? parent.appendChild(document.createElement(tag)) : document.body
  if (!parent) node.textContent = ''
  node.id = id
  if (inline != null) node.setAttribute('qor-inline', inline)
  if (source != null) node.setAttribute('src', source)
  if (name) node.className = name
  if (style) node.setAttribute('style', style)
  for (const child of below) build(child, node)
  scrolled.push([node, left, top])
}
function scroll() {
  for (const [node, left, top] of scrolled) node.scrollLeft = left, node.scrollTop = top
}
</script></body></html>)";
}

std::vector<std::pair<std::string, std::string>> RandomPage::Pictures() {
    std::vector<std::pair<std::string, std::string>> files;
    for (uint32_t i = 0; i < kPictures; ++i) {
        test::Picture picture = test::Plain(1 + i * 5 % 37, 1 + i * 7 % 23, 0);
        for (size_t at = 0; at < picture.pixels.size(); ++at) {
            const auto value = static_cast<uint32_t>(at) * (i * 2654435761u + 77777u);
            picture.pixels[at] = i % 3 ? value : value | 0xFF000000u;
        }
        files.emplace_back("p" + std::to_string(i) + ".png", test::Png(picture));
    }
    files.emplace_back("broken.png", files[5].second.substr(0, 50));
    files.emplace_back("slow.gif", test::Gif(20, 14, {5, 7, 30}));
    files.emplace_back("fast.gif", test::Gif(9, 9, {2, 2, 3, 2}));
    return files;
}

std::string RandomPage::PictureUrl() {
    const auto others = static_cast<uint32_t>(std::size(kOtherPictures)) - (animations_ ? 0 : kAnimations);
    const uint32_t chosen = Below(kPictures + others);
    return chosen < kPictures ? "p" + std::to_string(chosen) + ".png" : kOtherPictures[chosen - kPictures];
}

std::string RandomPage::PictureChange() {
    const std::string picture = "url(" + PictureUrl() + ")";
    const auto style = [](const std::string& property, const std::string& value) {
        return "s.setProperty('" + property + "', '" + value + "')";
    };
    switch (Below(5)) {
        case 0:
            return style("background-image", "url(" + PictureUrl() + "), " + picture);
        case 1: {
            constexpr const char* kRepeats[] = {"stretch", "repeat", "round"};
            return style("border-image", picture + " 3 fill / 4px / 2px " + kRepeats[Below(3)]);
        }
        case 2:
            return style("mask-image", picture);
        case 3:
            return "if (e.localName == 'img') e.setAttribute('src', '" + PictureUrl() + "')";
        default:
            return style("background-image", picture);
    }
}

std::string RandomPage::Place() {
    char text[200];
    std::snprintf(text, sizeof(text),
                  "s.left = '%u.%upx'; s.top = '%dpx'; s.width = '%upx'; s.height = '%u%s'", Below(120),
                  Below(10), static_cast<int>(Below(100)) - 10, 5 + Below(70), 5 + Below(50),
                  Below(5) ? "px" : "%");
    return text;
}

std::string RandomPage::Style() {
    const std::vector<Choices>& styles = VisualStyles();
    const Choices& chosen = styles[Below(static_cast<uint32_t>(styles.size()))];
    const char* value = chosen.values[Below(static_cast<uint32_t>(chosen.values.size()))];
    return *value ? std::string("s.setProperty('") + chosen.property + "', '" + value + "')"
                  : std::string("s.removeProperty('") + chosen.property + "')";
}

std::string RandomPage::TreeChange() {
    constexpr uint32_t kMostBoxes = 40;
    switch (Below(4)) {
        case 0: {
            const std::string box = Box();
            return "{ const e = " + box + "; if (e && e.id != 'b0') e.parentNode.removeChild(e) }";
        }
        case 1:
            return "put(" + Box() + ", " + Box() + ", " + Box() + ")";
        default:
            if (boxes_ >= kMostBoxes)
                return "put(make(" + std::to_string(1 + Below(boxes_)) + " + 100), " + Box() + ")";
            const std::string parent = Below(3) ? Box() : "$('b0')";
            return "put(make(" + std::to_string(boxes_++) + "), " + parent + ", " + Box() + ")";
    }
}

std::string RandomPage::TextChange() {
    const std::string text = Quoted(kTexts[Below(std::size(kTexts))]);
    return "{ const e = " + Box() +
           "; if (e && e.firstChild && e.firstChild.nodeType == 3) e.firstChild.data = " + text +
           "; else if (e && !e.firstChild) e.textContent = " + text + " }";
}

std::string RandomPage::Change() {
    switch (Below(12)) {
        case 0:
        case 1:
            return TreeChange();
        case 2:
            return TextChange();
        case 3: {
            const char* axis = Below(2) ? "scrollTop" : "scrollLeft";
            return "{ const e = " + Box() + "; if (e) e." + axis + " = " + std::to_string(Below(40)) + " }";
        }
        case 4:
            return "{ const e = " + Box() + "; if (e) e.classList.toggle(" +
                   Quoted(kClasses[Below(std::size(kClasses))]) + ") }";
        case 5:
            return "{ const e = " + Box() + "; if (e && e.id != 'b0') { const s = e.style; " + Place() +
                   " } }";
        case 6:
        case 7:
            return "{ const e = " + Box() + "; if (e) { const s = e.style; " + PictureChange() + " } }";
        default:
            return "{ const e = " + Box() + "; if (e) { const s = e.style; " + Style() + " } }";
    }
}

std::string RandomPage::NextFrame() {
    std::string script;
    for (uint32_t changes = 1 + Below(3); changes > 0; --changes)
        script += Change() + "\n";
    return script;
}

}  // namespace qorvex::pages
