#include "script/bindings/bindings_fixture.h"

namespace qorvex::script::test {
namespace {

class EventBindingTest : public BindingsTest {
  protected:
    EventBindingTest() {
        OpenPage("<body><div id=a></div></body>");
        Run("const a = document.getElementById('a'); let seen = [];"
            "const fire = (type, init, target) => (target || a).dispatchEvent(new Event(type, init))");
    }
    std::string Seen() { return Run("seen.splice(0).join()"); }
};

TEST_F(EventBindingTest, ListensAndDispatches) {
    Run("const f = e => seen.push(e.type + e.eventPhase + (e.target === a) + (e.currentTarget === a));"
        "a.addEventListener('x', f); a.addEventListener('x', f); fire('x')");
    EXPECT_EQ(Seen(), "x2truetrue");
    Run("a.removeEventListener('x', f); fire('x')");
    EXPECT_EQ(Seen(), "");
    Run("addEventListener('x', function(e) { seen.push('w' + (this === window)); }, true);"
        "document.addEventListener('x', () => seen.push('d'), { capture: true });"
        "document.body.addEventListener('x', () => seen.push('b')); fire('x', { bubbles: true })");
    EXPECT_EQ(Seen(), "wtrue,d,b");
    EXPECT_EQ(Run("a.addEventListener('x', null); fire('x'); a.addEventListener('y')"),
              "throws Error: Failed to execute 'addEventListener' on 'EventTarget': "
              "2 arguments required, but only 1 present");
    EXPECT_EQ(Run("addEventListener('y')"),
              "throws Error: Failed to execute 'addEventListener' on 'Window': "
              "2 arguments required, but only 1 present");
}

TEST_F(EventBindingTest, StopsAndPrevents) {
    Run("a.addEventListener('x', e => { seen.push(1); e.preventDefault(); e.stopPropagation(); });"
        "document.addEventListener('x', () => seen.push(2))");
    EXPECT_EQ(Run("[fire('x', { bubbles: true, cancelable: true }), fire('x', { bubbles: true })]"),
              "false,true");
    EXPECT_EQ(Seen(), "1,1");
    EXPECT_EQ(Run("a.dispatchEvent(null)"), "false");
    EXPECT_EQ(Run("a.dispatchEvent(document.createEvent('Event'))"), "false");
    EXPECT_EQ(Run("document.createEvent('Nothing')"), "null");
}

TEST_F(EventBindingTest, AThrowingListenerIsReportedAndTheNextRuns) {
    Run("a.addEventListener('x', () => { throw new Error('listener'); }); a.addEventListener('x', () => "
        "seen.push(1));"
        "fire('x')");
    EXPECT_EQ(Seen(), "1");
    EXPECT_EQ(log_.Count("Error: listener"), 1u);
}

TEST_F(EventBindingTest, HandlerAttributesKeepFunctionsOnly) {
    EXPECT_EQ(Run("a.onclick"), "null");
    Run("a.onclick = function(e) { seen.push(this === a, e.type); }; fire('click')");
    EXPECT_EQ(Seen(), "true,click");
    EXPECT_EQ(Run("Object.keys(a).length + typeof a.__click + typeof a.onclick"), "0functionfunction");
    EXPECT_EQ(Run("a.onclick = 5; fire('click'); a.onclick"), "null");
    EXPECT_EQ(Seen(), "");
    Run("window.onresize = () => seen.push('r'); window.dispatchEvent(new UIEvent('resize'))");
    EXPECT_EQ(Seen(), "r");
}

TEST_F(EventBindingTest, ConstructsEvents) {
    EXPECT_EQ(
        Run("const e = new CustomEvent('c', { detail: { k: 1 }, cancelable: true });"
            "[e.type, e.detail.k, e.bubbles, e.cancelable, e instanceof Event, e.AT_TARGET, Event.NONE]"),
        "c,1,false,true,true,2,0");
    EXPECT_EQ(Run("new CustomEvent('c').detail"), "null");
    EXPECT_EQ(Run("const i = document.createEvent('CustomEvent'); i.initCustomEvent('k', true, false, 7);"
                  "i.type + i.bubbles + i.detail"),
              "ktrue7");
    EXPECT_EQ(Run("class Mine extends Event { constructor() { super('mine'); } who() { return 'me'; } }"
                  "const m = new Mine(); m.who() + m.type + (m instanceof Mine)"),
              "meminetrue");
}

TEST_F(EventBindingTest, ListenersMayRemoveTheTreeUnderThem) {
    Run("a.addEventListener('x', () => { a.parentNode.removeChild(a); document.body.textContent = ''; });"
        "document.body.addEventListener('x', () => seen.push('b')); fire('x', { bubbles: true })");
    Collect();
    EXPECT_EQ(Run("a.parentNode"), "null");
}

TEST_F(EventBindingTest, AnEventKeptByScriptForgetsADeadTarget) {
    Run("let kept; (function() { const t = document.createElement('i');"
        "t.addEventListener('x', e => { kept = e; }); t.dispatchEvent(new Event('x'));"
        "seen.push(kept.target === t); })()");
    EXPECT_EQ(Seen(), "true");
    for (int i = 0; i < 3; ++i)
        Collect();
    EXPECT_NE(Run("String(kept.target)"), "undefined");
}

TEST_F(EventBindingTest, HandlerAttributesOfThePageRun) {
    Run("a.setAttribute('onclick', 'seen.push(event.type + (this === a))'); fire('click')");
    EXPECT_EQ(Seen(), "clicktrue");
    Run("a.setAttribute('onclick', '}{')");
    EXPECT_EQ(log_.Count("onclick attribute value is not a valid function: \"}{\"!"), 1u);
}

}  // namespace
}  // namespace qorvex::script::test
