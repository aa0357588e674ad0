// Layout through the public interfaces: sizes that no screen has, more nesting than layout takes part in, and
// the switches of the flex engine.
#include <gtest/gtest.h>
#include <qorvex/debug_interface.h>
#include <qorvex/feature_interfaces.h>

#include <cmath>
#include <map>

#include "core/frame/client.h"

namespace qorvex::pages {
namespace {

class LayoutPages : public testing::Test {
  protected:
    using Boxes = std::map<std::string, ElementBox>;

    // Of the elements with an id. No number of any box may be none.
    Boxes CheckedBoxes() {
        struct Visit {
            Boxes boxes;
            bool finite = true;
        } visit;
        auto* debug = static_cast<IDebugInterface*>(client_.library->GetFeatureInterface(kDebugFeature));
        debug->VisitElementBoxes(
            client_.view,
            [](void* out, const ElementBox& box) {
                auto& visit = *static_cast<Visit*>(out);
                for (const float number : {box.X, box.Y, box.Width, box.Height})
                    visit.finite = visit.finite && std::isfinite(number);
                visit.finite = visit.finite && box.Width >= 0 && box.Height >= 0;
                visit.boxes[box.Id] = box;
            },
            &visit);
        EXPECT_TRUE(visit.finite);
        return visit.boxes;
    }
    void Load(const std::string& html) { client_.Load(html, "coui://case/index.html"); }
    void Script(const std::string& text) {
        client_.view->ExecuteScript(text.c_str());
        client_.Frame();
        client_.Frame();
    }

    static client::Options Quiet() {
        client::Options options;
        options.severity = Logging::Warning;
        return options;
    }
    client::Client client_{Quiet()};
};

// Five levels of one style, so that factors and percentages multiply, in each engine and in a paragraph.
TEST_F(LayoutPages, SizesWithoutMeasure) {
    const std::string sizes[] = {"1e9px", "-1e9px", "3e38px", "-3e38px", "1e9%",    "-1e9%",
                                 "3e38%", "1e30em", "1e38vw", "1e38in",  "1e-40px", "-0px"};
    const std::string lines[] = {"",
                                 "flex:1;",
                                 "flex:3e38 3e38 3e38px;",
                                 "position:absolute;",
                                 "position:fixed;right:0;",
                                 "flex-wrap:wrap;align-content:stretch;flex-direction:row;"};
    const std::string containers[] = {"<body style='display:block'>", "<body style='display:simple'>",
                                      "<body style='display:simple'><div style='display:flex'>",
                                      "<body><p qor-inline>text "};
    for (const std::string& container : containers) {
        for (const std::string& size : sizes) {
            SCOPED_TRACE(container + " " + size);
            std::string page = "<html>" + container;
            for (const std::string& line : lines) {
                const std::string style = "<div style='" + line + "width:" + size + ";height:" + size +
                                          ";min-width:" + size + ";max-height:" + size + ";margin:" + size +
                                          ";padding:" + size + ";left:" + size + ";top:" + size +
                                          ";border:" + size + " solid red;transform:translate(" + size + "," +
                                          size + ")'>";
                page += style + style + style + style + style + "text</div></div></div></div></div>";
            }
            Load(page + "<div id=last style='width:5px;height:6px'></div>");
            const ElementBox last = CheckedBoxes()["last"];
            EXPECT_EQ(last.Height, 6);
        }
    }
}

// Script may store any number.
TEST_F(LayoutPages, NumbersFromScript) {
    for (const std::string display : {"block", "flex", "simple"}) {
        SCOPED_TRACE(display);
        Load("<html><body style='display:" + display +
             "'><div id=a><div id=b>text</div><div id=c style='position:absolute'></div></div>"
             "<div id=d style='width:5px;height:6px;position:absolute'></div>");
        for (const std::string number : {"NaN", "Infinity", "-Infinity", "1e300", "-1e300", "1e-320"}) {
            for (const std::string unit : {"PX", "PERCENT", "VW"}) {
                std::string script =
                    "for (const id of ['a', 'b', 'c']) { const s = document.getElementById(id).style;";
                for (const std::string name : {"width", "height", "left", "top", "right", "bottom",
                                               "minWidth", "maxHeight", "marginLeft", "paddingTop"})
                    script += "s." + name + unit + " = " + number + ";";
                Script(script + "}");
                CheckedBoxes();
            }
        }
        Script(
            "for (const id of ['a', 'b', 'c']) document.getElementById(id).style.cssText = "
            "'width:7px;height:8px'");
        EXPECT_EQ(CheckedBoxes()["b"].Width, 7);
    }
}

// A percentage of a height that depends on its content.
TEST_F(LayoutPages, PercentagesOfNothing) {
    Load(
        "<html><body><div style='display:flex'><div><div id=a style='height:50%;width:10px'><div id=content "
        "style='height:20px'></div></div></div></div><div style='position:absolute'><div id=b "
        "style='width:50%;min-height:50%;padding:10%;margin:10%;flex:1 1 50%'></div></div>");
    EXPECT_EQ(CheckedBoxes()["content"].Height, 20);
}

TEST_F(LayoutPages, NestingBeyondTheLimit) {
    constexpr int kLevels = 5000;
    const std::string build =
        "{ document.body.innerHTML = ''; let e = document.body; for (let i = 1; i <= " +
        std::to_string(kLevels) +
        "; ++i) { const d = document.createElement('div'); d.id = 'n' + i; e.appendChild(d); e = d } "
        "e.style.height = '7px' }";
    const std::string warning = "The document nests deeper than 512 levels; deeper content is not shown";
    for (const std::string display : {"block", "flex", "simple"}) {
        SCOPED_TRACE(display);
        Load(
            "<html><style>div{padding-left:1px;min-height:3px;width:30px;height:20px}</style><body "
            "style='margin:0;display:" +
            display + "'>");
        client_.log.Clear();
        Script(build);
        Boxes boxes = CheckedBoxes();
        EXPECT_EQ(client_.log.Count(warning), 1u);
        EXPECT_EQ(boxes["n500"].Height, 20);
        EXPECT_EQ(boxes["n520"].Height, 0);
        EXPECT_EQ(boxes["n5000"].Height, 0);
        // What was too deep is laid out once it is not any more.
        Script("document.body.appendChild(document.getElementById('n4990'))");
        boxes = CheckedBoxes();
        EXPECT_EQ(boxes["n4990"].Height, 20);
        EXPECT_EQ(boxes["n5000"].Height, 7);
    }
}

TEST_F(LayoutPages, TheFlexAlgorithmCanBeSwitchedOff) {
    auto* layout =
        static_cast<ILayoutDebugging*>(client_.library->GetFeatureInterface(kLayoutDebuggingFeature));
    Load("<html><body style='margin:0'><div id=a style='width:10px;height:10px'></div>");
    layout->SetFlexAlgorithm(client_.view, 1);
    Script("document.getElementById('a').style.width = '50px'");
    EXPECT_EQ(CheckedBoxes()["a"].Width, 10);
    // Any other value is the usual one, and what was missed is caught up with.
    layout->SetFlexAlgorithm(client_.view, 7);
    client_.Frame();
    client_.Frame();
    EXPECT_EQ(CheckedBoxes()["a"].Width, 50);
    layout->SetFlexAlgorithm(nullptr, 1);
}

}  // namespace
}  // namespace qorvex::pages
