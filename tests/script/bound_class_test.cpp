// What script sees of a class that is declared as data.
#include "script/script_fixture.h"

namespace qorvex::script::test {
namespace {

class BoundClass : public ScriptTest {
  protected:
    BoundClass() {
        SetGlobal("node", MakeHandle<TestNode>(counts_).get());
        SetGlobal("element", MakeHandle<TestElement>(counts_).get());
        SetGlobal("list", MakeHandle<TestList>(counts_).get());
    }
};

TEST_F(BoundClass, ConvertsArgumentsAndResultsByType) {
    EXPECT_EQ(Run("node.sum('2', 3.9)"), "5");
    EXPECT_EQ(Run("node.sum(-1, -1)"), "-2");
    EXPECT_EQ(Run("node.sum(NaN, Infinity)"), "0");
    EXPECT_EQ(Run("node.sum(4294967297, 0)"), "1");
    EXPECT_EQ(Run("node.number = '0x10'; node.number"), "16");
    EXPECT_EQ(Run("node.name = 'gr\\u00fc\\u00df\\u{1F600}'; node.name"), "gr\u00fc\u00df\U0001F600");
    EXPECT_EQ(Run("node.join()"), "undefined,none");
    EXPECT_EQ(Run("node.join(null, null)"), "null,null");
    EXPECT_EQ(Run("node.join('x'.repeat(5000), 1).length"), "5002");
    EXPECT_EQ(Run("String(node.held) + node.absent + node.hold(null)"), "nullnullundefined");
    EXPECT_EQ(Run("node.hold(element); node.held === element"), "true");
    EXPECT_EQ(Run("node.contains(node)"), "true");
}

TEST_F(BoundClass, CountsArgumentsBeforeAnythingElse) {
    EXPECT_EQ(Run("node.sum(1)"),
              "throws Error: Failed to execute 'sum' on 'Node': 2 arguments required, but only 1 present");
    EXPECT_EQ(Run("node.sum.call(5)"),
              "throws Error: Failed to execute 'sum' on 'Node': 2 arguments required, but only 0 present");
    EXPECT_EQ(Run("element.sum()"),
              "throws Error: Failed to execute 'sum' on 'Node': 2 arguments required, but only 0 present");
}

TEST_F(BoundClass, ConvertsFromTheLastArgumentToTheFirst) {
    EXPECT_EQ(Run("let seen = ''; const say = (name, v) => ({ valueOf() { seen += name; return v; } });"
                  "node.sum(say('a', 1), say('b', 2)) + seen"),
              "3ba");
}

TEST_F(BoundClass, AConversionThatThrowsEndsTheCall) {
    EXPECT_EQ(Run("node.sum({ valueOf() { throw new RangeError('no'); } }, 1)"), "throws RangeError: no");
    EXPECT_EQ(Run("node.name = 'before'; try { node.name = Symbol('x'); } catch (e) { } node.name"),
              "before");
}

TEST_F(BoundClass, AForeignThisGetsUndefinedAndNothingCrashes) {
    for (const char* self : {"{}", "null", "undefined", "5", "list", "globalThis", "Math", "node.sum",
                             "Node.prototype", "new Proxy(node, {})", "Object.create(node)"}) {
        EXPECT_EQ(Run((std::string("String(node.sum.call(") + self + ", 1, 2))").c_str()), "undefined")
            << self;
        EXPECT_EQ(Run((std::string("Object.getOwnPropertyDescriptor(Node.prototype, 'number').get.call(") +
                       self + ")")
                          .c_str()),
                  "undefined")
            << self;
    }
    EXPECT_EQ(Run("element.fail.call(node, 'x')"), "undefined");
    EXPECT_EQ(Run("node.contains(list) || node.contains({}) || node.contains(7)"), "false");
}

TEST_F(BoundClass, ObjectsOfTheClientsOwnClassesAreForeignToo) {
    JSClassDefinition definition = kJSClassDefinitionEmpty;
    definition.className = "Client";
    JSClassRef client = JSClassCreate(&definition);
    int data = 0;
    void* privates[] = {nullptr, &data, reinterpret_cast<void*>(uintptr_t{42}),
                        reinterpret_cast<void*>(~uintptr_t{0})};
    for (void* value : privates) {
        SetProperty(page_.context, JSContextGetGlobalObject(page_.context), "client",
                    JSObjectMake(page_.context, client, value), kJSPropertyAttributeNone);
        EXPECT_EQ(Run("node.sum.call(client, 1, 2)"), "undefined");
        EXPECT_EQ(Run("node.contains(client)"), "false");
    }
    JSClassRelease(client);
}

TEST_F(BoundClass, AWaitingErrorOfNativeCodeBecomesTheCallsException) {
    EXPECT_EQ(Run("element.fail('deep trouble')"), "throws Error: deep trouble");
    EXPECT_EQ(Run("try { element.fail('x'); } catch (e) { (e instanceof Error) + e.constructor.name }"),
              "trueError");
    EXPECT_EQ(page_.pending_exception, nullptr);
    EXPECT_EQ(Run("element.sum(1, 1)"), "2");
}

TEST_F(BoundClass, PrototypesChainAsTheClassesDo) {
    EXPECT_EQ(Run("Object.getPrototypeOf(element) === Element.prototype"), "true");
    EXPECT_EQ(Run("Object.getPrototypeOf(Element.prototype) === Node.prototype"), "true");
    EXPECT_EQ(Run("Object.getPrototypeOf(HTMLVideoElement.prototype) === HTMLMediaElement.prototype"),
              "true");
    EXPECT_EQ(Run("[element instanceof Element, element instanceof EventTarget, node instanceof Element]"),
              "true,true,false");
    EXPECT_EQ(Run("typeof Element + Element.name + Element.prototype.constructor.name"),
              "functionElementElement");
    EXPECT_EQ(Run("Object.prototype.toString.call(element)"), "[object Element]");
    EXPECT_EQ(Run("Object.prototype.toString.call(globalThis) + (globalThis instanceof Window) +"
                  " (globalThis instanceof EventTarget) + ({} instanceof Window)"),
              "[object Window]truetruefalse");
    EXPECT_EQ(Run("Node.prototype.twice = function() { return this.number * 2; };"
                  "element.number = 4; element.twice()"),
              "8");
}

// Classes are made when they are first used: after the page has run, and whatever it has done to the
// language.
TEST_F(BoundClass, ClassesThatAreMadeLateAreTheSame) {
    EXPECT_EQ(page_.prototypes[static_cast<size_t>(ScriptClass::HTMLVideoElement)], nullptr);
    EXPECT_EQ(Run("Object.keys(globalThis).includes('Node') + ' ' + ('HTMLVideoElement' in globalThis)"),
              "false true");
    EXPECT_EQ(page_.prototypes[static_cast<size_t>(ScriptClass::HTMLVideoElement)], nullptr);
    Run("Object.defineProperty = Object.create = Object.setPrototypeOf = Reflect.apply = null;"
        "Object.prototype.get = Object.prototype.set = Object.prototype.value = 'page';"
        "Object.prototype.writable = false; Object.prototype[Symbol.toStringTag] = 'page';"
        "for (const i of [0, 5, 94, 95, 189, 200]) "
        "    Array.prototype.__defineSetter__(i, () => { throw 'entered the page'; }); 0");
    EXPECT_EQ(
        Run("[HTMLVideoElement === HTMLVideoElement, new (class { static x = HTMLVideoElement.name }) !== 0,"
            " HTMLVideoElement.prototype.constructor === HTMLVideoElement,"
            " Object.prototype.toString.call(HTMLVideoElement.prototype)].join()"),
        "true,true,true,[object HTMLVideoElement]");
    const auto node = MakeHandle<TestNode>(counts_);
    SetGlobal("late", node.get());
    Collect();
    EXPECT_EQ(Run("late.sum(1, 2) + Node.ELEMENT_NODE + (globalThis instanceof EventTarget)"), "5");
    EXPECT_EQ(Run("(class extends Node {}).prototype.constructor.name + late.constructor.name"), "Node");
}

TEST_F(BoundClass, APageMayTakeTheNameOfAClass) {
    EXPECT_EQ(Run("Event = 5; Event"), "5");
    EXPECT_EQ(Run("var Screen = 6; Screen"), "6");
    EXPECT_EQ(Run("function Touch() { return 7; } Touch()"), "7");
    EXPECT_EQ(Run("delete globalThis.Selection; typeof Selection"), "undefined");
    EXPECT_EQ(Run("const d = Object.getOwnPropertyDescriptor(globalThis, 'Event'); [d.value, d.enumerable]"),
              "5,false");
}

// What cannot be made on a full stack is made later, whole.
TEST_F(BoundClass, AClassFirstNamedOnAFullStackIsNotHalfMade) {
    Run("let depth = 0; (function f() { ++depth; try { f(); } catch (e) { try { HTMLVideoElement; } catch "
        "(e) {} } })();"
        "0");
    EXPECT_EQ(Run("Object.getPrototypeOf(HTMLVideoElement.prototype) === HTMLMediaElement.prototype"),
              "true");
    EXPECT_EQ(Run("typeof Node.prototype.sum + Node.prototype.TEXT_NODE + typeof HTMLMediaElement"),
              "function3function");
}

TEST_F(BoundClass, ConstructorsWithoutAConstructorRefuse) {
    EXPECT_EQ(Run("new Node()"), "throws Error: Invalid constructor!");
    EXPECT_EQ(Run("Element()"), "throws Error: Invalid constructor!");
    EXPECT_EQ(Run("class Mine extends Node {} new Mine()"), "throws Error: Invalid constructor!");
}

TEST_F(BoundClass, ConstantsStandOnConstructorAndPrototype) {
    EXPECT_EQ(Run("[Node.ELEMENT_NODE, node.TEXT_NODE, Element.ELEMENT_NODE]"), "1,3,1");
    EXPECT_EQ(Run("Node.ELEMENT_NODE = 9; Node.ELEMENT_NODE"), "1");
}

// Constructors are made when somebody asks; nobody can tell.
TEST_F(BoundClass, LateConstructorsLookAsIfTheyHadAlwaysBeenThere) {
    EXPECT_EQ(Run("[Comment.prototype.constructor === Comment, Text.prototype.constructor === Text,"
                  " Object.keys(Comment.prototype).includes('constructor'),"
                  " Object.prototype.toString.call(Comment.prototype)].join()"),
              "true,true,false,[object Comment]");
    // A write goes to the object that it is meant for.
    EXPECT_EQ(
        Run("element.constructor = 5; [element.constructor, Object.keys(element).includes('constructor'),"
            " Object.getPrototypeOf(element).constructor === Element].join()"),
        "5,true,true");
}

TEST_F(BoundClass, ReadOnlyAttributesIgnoreWrites) {
    EXPECT_EQ(Run("list.length = 9; list.length"), "3");
}

TEST_F(BoundClass, EveryClassHasItsConstructorAndThoseWithPropertyRulesTheirSlot) {
    for (const ScriptClassRow& row : kScriptClassRows) {
        EXPECT_EQ(Run((std::string("typeof ") + row.name).c_str()), "function") << row.name;
    }
    for (size_t i = 0; i < kScriptClassCount; ++i) {
        const auto script_class = static_cast<ScriptClass>(i);
        EXPECT_EQ(GetScriptClassTable()[script_class] != nullptr, HasPropertyRules(script_class)) << i;
    }
    EXPECT_STREQ(GetScriptClassRow(static_cast<ScriptClass>(0)).name, "CSSRuleList");
    EXPECT_STREQ(GetScriptClassRow(static_cast<ScriptClass>(94)).name, "TimeRanges");
}

TEST_F(BoundClass, TwoContextsShareClassesButNotPrototypes) {
    Run("Node.prototype.onlyHere = 1; 0");
    ScriptingContext other;
    JSContextGroupRef group = JSContextGroupCreate();
    other.context = JSGlobalContextCreateInGroup(group, nullptr);
    RegisterScriptingContext(other);
    InstallClasses(other);
    auto foreign = MakeHandle<TestNode>(counts_);
    JSValueRef value = nullptr;
    foreign->GetOrCreateWrapper(other.context, &value);
    EXPECT_TRUE(JSValueIsUndefined(other.context,
                                   GetProperty(other.context, const_cast<JSObjectRef>(value), "onlyHere")));
    EXPECT_EQ(GetScriptingContext(other.context), &other);
    EXPECT_EQ(GetScriptingContext(page_.context), &page_);
    ScriptContextTeardownScope teardown;
    UninstallClasses(other);
    UnregisterScriptingContext(other);
    JSGlobalContextRelease(other.context);
    JSContextGroupRelease(group);
    EXPECT_EQ(GetScriptingContext(page_.context), &page_);
}

}  // namespace
}  // namespace qorvex::script::test
