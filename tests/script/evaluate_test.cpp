// Running script that fails, hangs and exhausts the stack: the page goes on and the log tells.
#include "script/inline_handler_attribute.h"
#include "script/protected_value.h"
#include "script/script_fixture.h"

namespace qorvex::script::test {
namespace {

class Evaluate : public ScriptTest {};

TEST_F(Evaluate, LogsAnErrorOnceAndKeepsWhatTheScriptDid) {
    EvaluateScript(page_, "globalThis.x = 1; null.y; x = 2", "qor://page/a.js");
    ASSERT_EQ(log_.Count("Scripting error: TypeError: null is not an object (evaluating 'null.y') at: "), 1u);
    EXPECT_EQ(log_.Count("qor://page/a.js"), 1u);
    EXPECT_EQ(Run("x"), "1");
    EvaluateScript(page_, "throw 'text'", "");
    EXPECT_EQ(log_.Count("Scripting error: text at: "), 1u);
    EvaluateScript(page_, "throw null", "");
    EXPECT_EQ(log_.Count("Scripting error: null at: "), 1u);
    EvaluateScript(page_, "throw { toString() { throw 1; }, get stack() { throw 2; } }", "");
    EXPECT_EQ(log_.Count("Scripting error:  at: "), 1u);
    EvaluateScript(page_, "][", "");
    EXPECT_EQ(log_.Count("Scripting error: SyntaxError"), 1u);
}

TEST_F(Evaluate, TextThatIsNoUnicodeLosesNothingElse) {
    EvaluateScript(page_, "// caf\xE9\nglobalThis.x = 'a\xE9\xF0\x9F\x98\x80'", "latin.js");
    EXPECT_EQ(Run("x"), "a\uFFFD\U0001F600");
    EXPECT_EQ(Run("x.length"), "4");
    // Halves of pairs on their way out.
    EXPECT_EQ(Run("'ab\\ud83dcd\\udc00e'"), "ab\uFFFDcd\uFFFDe");
    EXPECT_EQ(Run("'\u00E9\\ud83d'"), "\u00E9\uFFFD");
    EXPECT_EQ(Run("'\\ud83d\\ude00'"), "\U0001F600");
    EXPECT_EQ(Run("'\\ud83d'.repeat(300)").size(), 900u);
}

TEST_F(Evaluate, ReportsExceptionsWithPlaceAndStack) {
    ReportException(page_.context, nullptr);
    EXPECT_EQ(log_.Count("Unable to report an exception where there is no such."), 1u);
    const JSObjectRef function = const_cast<JSObjectRef>(
        GetProperty(page_.context, JSContextGetGlobalObject(page_.context), "parseInt"));
    Run("globalThis.boom = function boom() { undefinedName(); }; 0");
    const JSObjectRef boom =
        const_cast<JSObjectRef>(GetProperty(page_.context, JSContextGetGlobalObject(page_.context), "boom"));
    EXPECT_EQ(CallFunction(page_.context, boom, nullptr, {}), nullptr);
    EXPECT_EQ(log_.Count("ReferenceError: Can't find variable: undefinedName\nAt ln: 1, col: "), 1u);
    EXPECT_EQ(log_.Count(".\nStack info: \nboom@"), 1u);
    EXPECT_NE(CallFunction(page_.context, function, nullptr, {}), nullptr);
}

TEST_F(Evaluate, SurvivesEndlessRecursionThroughNativeCode) {
    SetGlobal("node", MakeHandle<TestNode>(counts_).get());
    EXPECT_EQ(Run("(function f() { f(); })()"), "throws RangeError: Maximum call stack size exceeded.");
    EXPECT_EQ(Run("(function f() { node.sum({ valueOf: f }, 1); })()"),
              "throws RangeError: Maximum call stack size exceeded.");
    EXPECT_EQ(Run("node.sum(1, 1)"), "2");
}

TEST_F(Evaluate, TheWatchdogEndsAnEndlessLoopAndTheContextLivesOn) {
    SetScriptTimeLimit(group_, 0.05);
    EvaluateScript(page_, "try { while (true) { } } catch (e) { globalThis.caught = e; }", "loop.js");
    EXPECT_EQ(log_.Count("A script ran longer than its time limit and was stopped."), 1u);
    EXPECT_EQ(log_.Count("Scripting error: "), 1u);
    EXPECT_EQ(Run("typeof caught + (1 + 1)"), "undefined2");
    EvaluateScript(page_, "for (;;) ;", "again.js");
    EXPECT_EQ(log_.Count("A script ran longer than its time limit and was stopped."), 2u);
}

TEST_F(Evaluate, SerialisesToJSON) {
    const auto json = [&](const char* source) {
        Run((std::string("globalThis.v = ") + source + "; 0").c_str());
        const JSValueRef value = GetProperty(page_.context, JSContextGetGlobalObject(page_.context), "v");
        return std::string(SerializeToJSON(page_.context, value).view());
    };
    EXPECT_EQ(json("{ a: [1, 'x', null] }"), R"({"a":[1,"x",null]})");
    EXPECT_EQ(std::string(SerializeToJSON(page_.context, nullptr).view()), "null");
    EXPECT_EQ(json("undefined"), "");
    EXPECT_EQ(json("(() => { const o = {}; o.o = o; return o; })()"), "");
}

TEST_F(Evaluate, RunsHugeSourcesAndOddText) {
    EvaluateScript(page_, std::string(10'000'000, ' ') + "globalThis.big = 1;", "big.js");
    EXPECT_EQ(Run("big"), "1");
    EvaluateScript(page_, "\xff\xfe", "");
    EvaluateScript(page_, std::string_view(), "");
    EXPECT_EQ(Run("1"), "1");
}

TEST_F(Evaluate, CountsTheEnginesMemoryAndPumps) {
    CollectGarbageNow(page_.context);  // the engine counts when it collects
    const ScriptEngineMemory before = GetScriptEngineMemory(page_.context);
    EXPECT_GT(before.heap_size, 0u);
    EXPECT_GE(before.heap_capacity, before.heap_size);
    Run("globalThis.many = []; for (let i = 0; i < 100000; ++i) many.push({ i }); 0");
    CollectGarbageNow(page_.context);
    EXPECT_GT(GetScriptEngineMemory(page_.context).object_count, before.object_count + 90000);
    for (int i = 0; i < 3; ++i)
        PumpScriptEngine();
}

TEST_F(Evaluate, HandlerAttributesBecomeFunctionsOfTheirObject) {
    Run("globalThis.target = {}; 0");
    const JSObjectRef target = const_cast<JSObjectRef>(
        GetProperty(page_.context, JSContextGetGlobalObject(page_.context), "target"));
    InstallInlineHandler(page_.context, target, "onclick", "return [this === target, event];");
    EXPECT_EQ(Run("target.onclick(5)"), "true,5");
    InstallInlineHandler(page_.context, target, "onclick", "not a { function");
    EXPECT_EQ(log_.Count("onclick attribute value is not a valid function: \"not a { function\"!"), 1u);
    EXPECT_EQ(Run("target.onclick(6)"), "true,6");
    InstallInlineHandler(page_.context, target, "online-ish", "1");
    InstallInlineHandler(page_.context, target, "title", "1");
    EXPECT_EQ(Run("typeof target.title"), "undefined");
}

TEST_F(Evaluate, KeptValuesOutliveTheirContext) {
    Run("globalThis.v = { alive: 1 }; 0");
    ProtectedValue kept(page_.context,
                        GetProperty(page_.context, JSContextGetGlobalObject(page_.context), "v"));
    Run("v = null");
    Collect();
    EXPECT_EQ(std::string(SerializeToJSON(page_.context, kept.get()).view()), R"({"alive":1})");
    ProtectedValue moved = std::move(kept);
    EXPECT_FALSE(kept);
    DestroyContext();
    moved.reset();
}

}  // namespace
}  // namespace qorvex::script::test
