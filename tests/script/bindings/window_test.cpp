// Timers, animation frames and what stands on the global object.
#include "script/bindings/bindings_fixture.h"

namespace qorvex::script::test {
namespace {

class WindowTest : public BindingsTest {
  protected:
    WindowTest() {
        OpenPage("<body></body>");
        Run("let seen = []; const note = x => () => seen.push(x)");
    }
    std::string Seen() { return Run("seen.join()"); }
};

TEST_F(WindowTest, RunsDueTimersInOrderThenFramesOnce) {
    Run("requestAnimationFrame(t => seen.push('f' + t)); setTimeout(note('b'), 20); setTimeout(note('a'), "
        "10);"
        "setTimeout(note('a2'), 10); setTimeout(note('now'))");
    Advance(0);
    EXPECT_EQ(Seen(), "now,f1000");
    Advance(15);
    EXPECT_EQ(Seen(), "now,f1000,a,a2");
    Advance(10);
    Advance(10);
    EXPECT_EQ(Seen(), "now,f1000,a,a2,b");
    EXPECT_EQ(page_->window->timer_count(), 0u);
}

TEST_F(WindowTest, AScriptWithoutEndIsStoppedAndThePageGoesOn) {
    ClosePage();
    page_ = CreateScriptingContext(window_host_, *document_, 0.05);
    RunPreludeScripts(*page_);
    Run("setTimeout(() => { for (;;) ; }); setTimeout(() => { after = document.nodeName; }, 5)");
    Advance(10);
    EXPECT_EQ(Count(Logging::Error, "A script ran longer than its time limit and was stopped."), 1u);
    EXPECT_EQ(Run("after"), "#document");
}

TEST_F(WindowTest, RepeatsUntilCleared) {
    Run("let id = setInterval(() => { seen.push('i'); if (seen.length == 3) clearInterval(id); }, 10);"
        "setInterval(note('z'), 0)");
    for (int i = 0; i < 2; ++i)
        Advance(5);
    EXPECT_EQ(Seen(), "z,z,i");
    for (int i = 0; i < 20; ++i)
        Advance(10);
    EXPECT_EQ(Run("seen.filter(x => x == 'i').length"), "1");
    EXPECT_EQ(Run("seen.filter(x => x == 'z').length"), "22");
}

TEST_F(WindowTest, ClearsByIdAndIgnoresOthers) {
    EXPECT_EQ(Run("[setTimeout(note('a'), 1), setTimeout(note('b'), 1), requestAnimationFrame(note('c'))]"),
              "1,2,1");
    Run("clearTimeout(1); clearInterval(0); clearTimeout(99); clearTimeout('x'); cancelAnimationFrame(7)");
    Advance(5);
    EXPECT_EQ(Seen(), "b,c");
    EXPECT_EQ(Run("clearTimeout()"),
              "throws Error: Failed to execute 'clearTimeout' on 'Window': 1 arguments required, but only 0 "
              "present");
}

TEST_F(WindowTest, TimersTakeWhateverTheyAreGiven) {
    EXPECT_EQ(Run("setTimeout(null, 0)"), "1");
    Run("setTimeout('seen.push(1)', 0); setTimeout(function() { seen.push(arguments.length); }, 1, 1, 2);"
        "setTimeout(() => { throw new Error('lost'); }, 2); setTimeout(note('after'), 3)");
    Advance(10);
    EXPECT_EQ(Count(Logging::Warning, "Attempt to call a non-function value"), 1u);
    EXPECT_EQ(Seen(), "0,after");
    EXPECT_FALSE(log_.Contains("lost"));
}

TEST_F(WindowTest, FramesAreDetachedBeforeTheyRun) {
    Run("let second; requestAnimationFrame(() => { seen.push(1); cancelAnimationFrame(second);"
        "  requestAnimationFrame(note('next')); });"
        "second = requestAnimationFrame(note(2)); requestAnimationFrame(null)");
    Advance(1);
    EXPECT_EQ(Seen(), "1,2");
    Advance(1);
    EXPECT_EQ(Seen(), "1,2,next");
    Run("requestAnimationFrame(() => { throw new Error('told'); }); requestAnimationFrame(note('still'))");
    Advance(1);
    EXPECT_EQ(Seen(), "1,2,next,still");
    EXPECT_EQ(log_.Count("Error: told"), 1u);
}

TEST_F(WindowTest, HasTheGlobalsOfAPage) {
    EXPECT_EQ(Run("[window === this, self === window, parent === window, document.defaultView === window,"
                  " globalThis === window, window instanceof Window]"),
              "true,true,true,true,true,true");
    EXPECT_EQ(Run("[innerWidth, innerHeight, outerWidth, devicePixelRatio, screenX, performance.now()]"),
              "800,600,800,1,0,1000");
    EXPECT_EQ(Run("document = 5; document === window.document && document instanceof Document"), "true");
    EXPECT_EQ(Run("new Date(0).toLocaleDateString() === new Date(0).toDateString()"), "true");
    EXPECT_EQ(Run("window.getSelection()"), "null");
    EXPECT_EQ(Count(Logging::Warning, "Window::GetSelection is not available in this build"), 1u);
}

TEST_F(WindowTest, PendingWorkGoesWithThePage) {
    Run("for (let i = 0; i < 100; ++i) { setTimeout(note(i), 50); setInterval(note(i), 1);"
        "requestAnimationFrame(note(i)); addEventListener('x', note(i)); document.body.addEventListener('y', "
        "note(i)); }");
    ClosePage();
    OpenPage("<body id=fresh></body>");
    window_host_.time += 1000;
    Advance(1000);
    EXPECT_EQ(Run("typeof seen + document.body.id"), "undefinedfresh");
    EXPECT_EQ(page_->window->timer_count(), 0u);
}

}  // namespace
}  // namespace qorvex::script::test
