#include "script/script_fixture.h"

namespace qorvex::script::test {

namespace {

using BindNode = Binding<TestNode>;
constexpr AttributeDescription kNodeAttributes[] = {
    BindNode::ReadWrite<&TestNode::GetNumber, &TestNode::SetNumber>("number"),
    BindNode::ReadWrite<&TestNode::GetName, &TestNode::SetName>("name"),
    BindNode::ReadOnly<&TestNode::GetHeld>("held"),
    BindNode::ReadOnly<&TestNode::GetAbsent>("absent"),
};
constexpr MethodDescription kNodeMethods[] = {
    BindNode::Method<"sum", &TestNode::Sum, 2>(), BindNode::Method<"contains", &TestNode::Contains, 1>(),
    BindNode::Method<"make", &TestNode::Make>(),  BindNode::Method<"hold", &TestNode::Hold>(),
    BindNode::Method<"join", &TestNode::Join>(),
};
constexpr ConstantDescription kNodeConstants[] = {{"ELEMENT_NODE", 1}, {"TEXT_NODE", 3}};
constexpr ClassDescription kNode = {.script_class = ScriptClass::Node,
                                    .attributes = kNodeAttributes,
                                    .methods = kNodeMethods,
                                    .constants = kNodeConstants};

using BindElement = Binding<TestElement>;
constexpr MethodDescription kElementMethods[] = {BindElement::Method<"fail", &TestElement::Fail, 1>()};
constexpr ClassDescription kElement = {.script_class = ScriptClass::Element, .methods = kElementMethods};

constexpr AttributeDescription kListAttributes[] = {
    Binding<TestList>::ReadOnly<&TestList::GetLength>("length")};
constexpr ClassDescription kList = {.script_class = ScriptClass::NodeList, .attributes = kListAttributes};

constexpr const ClassDescription* kDescriptions[] = {&kNode, &kElement, &kList};

}  // namespace

ScriptTest::ScriptTest() {
    StartScriptEngine();
    CreateScriptClasses(kDescriptions);
    group_ = JSContextGroupCreate();
    page_.context = JSGlobalContextCreateInGroup(group_, nullptr);
    RegisterScriptingContext(page_);
    InstallClasses(page_);
}

ScriptTest::~ScriptTest() {
    DestroyContext();
    ReleaseScriptClasses();
}

void ScriptTest::DestroyContext() {
    if (!page_.context) return;
    ScriptContextTeardownScope teardown;
    UninstallClasses(page_);
    UnregisterScriptingContext(page_);
    JSGlobalContextRelease(page_.context);
    JSContextGroupRelease(group_);
    page_.context = nullptr;
}

std::string ScriptTest::Run(const char* source) {
    JSStringRef text = JSStringCreateWithUTF8CString(source);
    JSValueRef exception = nullptr;
    const JSValueRef value = JSEvaluateScript(page_.context, text, nullptr, nullptr, 0, &exception);
    JSStringRelease(text);
    const String result = ToNativeString(page_.context, exception ? exception : value);
    return (exception ? "throws " : "") + std::string(result.view());
}

void ScriptTest::SetGlobal(const char* name, ScriptingHandleEnabled* object) {
    SetProperty(page_.context, JSContextGetGlobalObject(page_.context), name, ToScript(page_.context, object),
                kJSPropertyAttributeNone);
}

// The collector takes whatever lies on the stack for pointers, finished frames below it included.
__attribute__((noinline)) void ScrubStack() {
    volatile char frame[128 * 1024];
    for (volatile char& byte : frame)
        byte = 0;
}

void ScriptTest::Collect() {
    ScrubStack();
    RunBody("let a = []; for (let i = 0; i < 2000; ++i) a.push({ i, b: [i] }); return a.length;");
    CollectGarbageNow(page_.context);
}

}  // namespace qorvex::script::test
