// The tree as script sees it.
#include "script/bindings/bindings_fixture.h"

namespace qorvex::script::test {
namespace {

class NodeBindingTest : public BindingsTest {
  protected:
    NodeBindingTest() {
        OpenPage(
            "<body><div id=a class='x y' data-some-key=v title=t>one<b>two</b></div><p id=p></p></body>");
        Run("const a = document.getElementById('a'), p = document.getElementById('p')");
    }
};

TEST_F(NodeBindingTest, GivesOneObjectPerNode) {
    EXPECT_EQ(Run("[document.body === document.body, a.parentNode === document.body, a.style === a.style,"
                  " a.firstChild.nextSibling === a.lastChild]"),
              "true,true,false,true");
    EXPECT_EQ(Run("a.mine = 1; document.getElementById('a').mine"), "1");
    EXPECT_EQ(Run("[a.nodeName, a.tagName, a.localName, a.nodeType, a.firstChild.nodeName, document.nodeName,"
                  " a.constructor.name, p.constructor.name, document.constructor.name]"),
              "DIV,DIV,div,1,#text,#document,HTMLDivElement,HTMLParagraphElement,HTMLDocument");
    EXPECT_EQ(Run("[a instanceof HTMLElement, a instanceof Node, a.firstChild instanceof Text, a.nodeValue,"
                  " a.firstChild.nodeValue, a.isConnected]"),
              "true,true,true,,one,true");
}

TEST_F(NodeBindingTest, ChangesTheTree) {
    Run("const s = document.createElement('span'); s.id = 's'; s.textContent = 'new';"
        "p.appendChild(s); p.insertBefore(document.createTextNode('before'), s)");
    EXPECT_EQ(Run("p.textContent + p.childNodes.length + p.children.length"), "beforenew21");
    EXPECT_EQ(Run("p.removeChild(s) === s && s.parentNode === null && !s.isConnected"), "true");
    EXPECT_EQ(Run("p.appendChild(null)"), "null");
    EXPECT_EQ(Run("p.appendChild({})"), "null");
    EXPECT_EQ(
        Run("p.appendChild()"),
        "throws Error: Failed to execute 'appendChild' on 'Node': 1 arguments required, but only 0 present");
    EXPECT_EQ(
        Run("const f = document.createDocumentFragment(); f.appendChild(new Text('t'));"
            "f.appendChild(new Comment('c')); p.textContent = ''; p.appendChild(f); p.childNodes.length"),
        "3");
    EXPECT_EQ(Run("a.contains(a.firstChild) && !p.contains(a) && a.cloneNode(true).isEqualNode(a)"), "true");
}

TEST_F(NodeBindingTest, ReadsAndWritesAttributes) {
    EXPECT_EQ(
        Run("[a.id, a.className, a.getAttribute('title'), a.getAttribute('none'), a.hasAttribute('title'),"
            " a.hasAttributes(), p.getAttribute('class')]"),
        "a,x y,t,,true,true,");
    EXPECT_EQ(Run("a.setAttribute('title', 5); a.getAttribute('title')"), "5");
    EXPECT_EQ(Run("a.removeAttribute('title'); a.getAttributeNames()"), "id,class,data-some-key");
    EXPECT_EQ(Run("a.attributes.item(1).value"), "x y");
    EXPECT_EQ(Run("a.setAttribute('x')"),
              "throws Error: Failed to execute 'setAttribute' on 'Element': "
              "2 arguments required, but only 1 present");
}

TEST_F(NodeBindingTest, KeepsListsAndMaps) {
    EXPECT_EQ(
        Run("const l = a.childNodes; [l.length, l[0].nodeValue, l.item(1).tagName, l[2], 0 in l, 99 in l,"
            " 'length' in l, 'nope' in l, l['x']]"),
        "2,one,B,,true,true,true,false,");
    EXPECT_EQ(Run("p.childNodes[0] === undefined && 0 in p.childNodes"), "true");
    EXPECT_EQ(Run("a.childNodes[4294967296] === a.childNodes[0]"), "true");
    EXPECT_EQ(Run("a.classList.add('z', 'w'); a.className + a.classList.toggle('q', false)"), "x y z wfalse");
    EXPECT_EQ(Run("a.dataset.someKey + ('someKey' in a.dataset) + a.dataset.other"), "vtrueundefined");
}

TEST_F(NodeBindingTest, NodesLiveAsLongAsScriptHoldsThem) {
    Run("let kept = document.createElement('div'); kept.tag = 'here'; "
        "kept.appendChild(document.createElement('i'));"
        "for (let i = 0; i < 500; ++i) document.createElement('div').x = i");
    Collect();
    EXPECT_EQ(Run("kept.tag + kept.firstChild.tagName"), "hereI");
    Run("p.appendChild(kept); kept = null");
    Collect();
    EXPECT_EQ(Run("p.firstChild.tag"), "here");
}

TEST_F(NodeBindingTest, RefusesConstructorsAndForeignObjects) {
    EXPECT_EQ(Run("new Element()"), "throws Error: Invalid constructor!");
    EXPECT_EQ(Run("new HTMLDivElement()"), "throws Error: Invalid constructor!");
    EXPECT_EQ(Run("Element.prototype.getAttribute.call(document, 'id')"), "undefined");
    EXPECT_EQ(Run("Element.prototype.getAttribute.call({}, 'id')"), "undefined");
    EXPECT_EQ(Run("a.getAnimations()"), "null");
    EXPECT_EQ(Count(Logging::Warning, "Element::GetAnimations is not available in this build"), 1u);
}

}  // namespace
}  // namespace qorvex::script::test
