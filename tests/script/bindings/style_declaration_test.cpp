#include "script/bindings/bindings_fixture.h"

namespace qorvex::script::test {
namespace {

class StyleDeclarationTest : public BindingsTest {
  protected:
    StyleDeclarationTest() {
        OpenPage("<body><div id=a style='color: #ff0000; left: 10px'></div></body>");
        Run("const a = document.getElementById('a'), s = a.style");
    }
    bool IsDirty() {
        const bool dirty = document_->GetSelectorDirtyElements().contains(&Find("a"));
        document_->GetSelectorDirtyElements().clear();
        return dirty;
    }
};

TEST_F(StyleDeclarationTest, ReadsAndWritesLonghands) {
    EXPECT_EQ(Run("[s.left, s.top, s.display]"), "10px,,");
    EXPECT_EQ(Run("s.display = 'none'; s.borderTopWidth = '3px'; s.opacity = 0.5; s.zIndex = 4;"
                  "[s.display, s.borderTopWidth, s.opacity, s.zIndex]"),
              "none,3px,0.5,4");
    EXPECT_EQ(Run("s.display = ''; s.left = null; [s.display, s.left]"), ",");
    EXPECT_EQ(Run("s.width = 'rubbish'; s.width"), "null");
    EXPECT_EQ(Count(Logging::Warning, "Unable to create declaration from string: rubbish"), 1u);
}

TEST_F(StyleDeclarationTest, MarksTheElementOnceForEqualValues) {
    document_->GetSelectorDirtyElements().clear();
    Run("s.width = '5px'");
    EXPECT_TRUE(IsDirty());
    Run("s.width = '5px'");
    EXPECT_FALSE(IsDirty());
    Run("s.width = ''");
    EXPECT_TRUE(IsDirty());
    Run("s.width = ''");
    EXPECT_FALSE(IsDirty());
}

TEST_F(StyleDeclarationTest, ExpandsShorthands) {
    EXPECT_EQ(Run("s.margin = '1px 2px'; [s.marginTop, s.marginRight, s.marginBottom, s.marginLeft]"),
              "1px,2px,1px,2px");
    Run("s.padding = 'calc(1px + 2px)'");
    EXPECT_EQ(
        Count(Logging::Warning,
              "Custom CSS expressions are not supported in shorthand declarations: Padding: calc(1px + 2px). "
              "Please use the long versions of the CSS property."),
        1u);
}

TEST_F(StyleDeclarationTest, ReadsAndWritesNumbersInUnits) {
    EXPECT_EQ(Run("s.leftPX = 20; s.left + s.leftPX"), "20px20");
    EXPECT_EQ(Run("s.widthVW = 50; [s.width, s.widthPX, s.widthVW]"), "50vw,400,50");
    EXPECT_EQ(Run("s.heightVH = 10; s.heightPX"), "60");
    EXPECT_EQ(Run("s.widthPX = NaN; s.widthVW"), "50");
    EXPECT_EQ(Count(Logging::Debug, "Trying to set widthPX property to invalid value!"), 1u);
    EXPECT_EQ(Run("s.top = '2em'; s.topPX"), "2");
    EXPECT_EQ(Count(Logging::Warning,
                    "Could not evaluate property value in px units. Property was not converted to px units."),
              1u);
}

TEST_F(StyleDeclarationTest, WorksByNameAndAsText) {
    EXPECT_EQ(Run("s.setProperty('margin-top', '4px'); s.getPropertyValue('margin-top') + s.marginTop"),
              "4px4px");
    EXPECT_EQ(Run("s.setProperty('--own', ' 7px'); s.getPropertyValue('--own').trim()"), "7px");
    // What cannot be a variable's value leaves the old one.
    EXPECT_EQ(Run("s.setProperty('--own', 'var(--'); s.setProperty('--', '1px'); s.width = 'var(--own)';"
                  "s.getPropertyValue('--own').trim()"),
              "7px");
    EXPECT_EQ(
        Run("s.removeProperty('margin-top') + s.getPropertyValue('margin-top') + s.getPropertyValue('nope')"),
        "4px");
    EXPECT_EQ(Run("s.cssText = 'top: 1px'; [s.top, s.left, s.cssText, a.getAttribute('style')]"),
              "1px,,top: 1px; ,top: 1px; ");
    EXPECT_EQ(Run("a.style = 'top: 2px'; s.top"), "2px");
    EXPECT_EQ(Run("s.getPropertyValue()"),
              "throws Error: Failed to execute 'getPropertyValue' on 'ElementStyleExtractor': "
              "1 arguments required, but only 0 present");
}

TEST_F(StyleDeclarationTest, ComputedFormsAreReadOnly) {
    EXPECT_EQ(Run("const c = getComputedStyle(a); typeof c.display"), "string");
    EXPECT_EQ(Run("c.width = '1px'"),
              "throws Error: Failed to set Width on 'CSSStyleDeclaration': Computed styles are read-only.");
    EXPECT_EQ(Run("c.leftPX = 1"),
              "throws Error: Failed to set LeftPX on 'CSSStyleDeclaration': Computed styles are read-only.");
    EXPECT_EQ(Run("getComputedStyle(null)"), "null");
}

TEST_F(StyleDeclarationTest, StyleObjectsHoldTheirElement) {
    Run("let lone = document.createElement('div').style; lone.left = '3px'");
    Collect();
    EXPECT_EQ(Run("lone.left"), "3px");
    Run("for (let i = 0; i < 1000; ++i) a.style.left = i + 'px'");
    Collect();
    EXPECT_EQ(Run("a.style.left"), "999px");
}

}  // namespace
}  // namespace qorvex::script::test
