// What script pays for being bound: calls of a method and of a getter of an element, and the first wrapper of
// a node, each against the bare C API.
#include <JavaScriptCore/JavaScript.h>
#include <benchmark/benchmark.h>

#include <vector>

#include "benchmarks/page.h"
#include "core/view_impl.h"
#include "dom/document.h"
#include "dom/element.h"
#include "script/convert.h"
#include "script/engine_seam.h"

namespace {

using namespace qorvex;

constexpr int kCalls = 50000;

// A page whose one marked element lies behind five classes: HTMLDivElement to EventTarget.
class ScriptPage {
  public:
    ScriptPage() : page_({.markup = "<body><div id=d class=c></div></body>"}) {
        if (!page_.IsComplete()) std::abort();  // an empty view would be measured
        document_ = static_cast<ViewImpl&>(page_.view()).GetDocument();
        context_ = document_->GetScriptingContext()->context;
    }
    dom::Document& document() { return *document_; }
    JSGlobalContextRef context() { return context_; }

  private:
    ::bench::Page page_;
    dom::Document* document_ = nullptr;
    JSGlobalContextRef context_ = nullptr;
};

JSValueRef Evaluate(JSContextRef context, const char* source) {
    JSStringRef text = JSStringCreateWithUTF8CString(source);
    const JSValueRef value = JSEvaluateScript(context, text, nullptr, nullptr, 0, nullptr);
    JSStringRelease(text);
    return value;
}

// The trivial work of the baseline: a number, without a look at `this`.
JSValueRef ReturnNumber(JSContextRef context, JSObjectRef, JSObjectRef, size_t, const JSValueRef[],
                        JSValueRef*) {
    return JSValueMakeNumber(context, 1);
}

// `target` with a bare callback as `count`, as a function or behind an accessor.
void InstallBare(JSContextRef context) {
    JSStringRef name = JSStringCreateWithUTF8CString("bareCallback");
    JSObjectSetProperty(context, JSContextGetGlobalObject(context), name,
                        JSObjectMakeFunctionWithCallback(context, name, ReturnNumber),
                        kJSPropertyAttributeNone, nullptr);
    JSStringRelease(name);
}

// Runs `expression` kCalls times an iteration; `target` is an object that `setup` gives.
void Call(benchmark::State& state, const char* setup, const char* expression, bool baseline) {
    ScriptPage page;
    JSContextRef context = page.context();
    if (baseline) InstallBare(context);
    const std::string source = "(function() { const target = " + std::string(setup) +
                               "; return function() { let sum = 0; for (let i = 0; i < " +
                               std::to_string(kCalls) + "; ++i) sum += " + expression +
                               "; return sum; }; })()";
    auto* function = const_cast<JSObjectRef>(Evaluate(context, source.c_str()));
    JSValueProtect(context, function);
    // The engine compiles what runs often.
    for (int i = 0; i < 10; ++i)
        JSObjectCallAsFunction(context, function, nullptr, 0, nullptr, nullptr);
    for (auto _ : state)
        JSObjectCallAsFunction(context, function, nullptr, 0, nullptr, nullptr);
    JSValueUnprotect(context, function);
    state.counters["items"] = kCalls;
    state.counters["target"] = 1.2;
}

constexpr const char* kElement = "document.getElementById('d')";
constexpr const char* kBareObject =
    "Object.defineProperty({ call: bareCallback }, 'get', { get: bareCallback })";

BENCHMARK_CAPTURE(Call, bound, kElement, "target.hasAttributes()", false)->Name("script_call");
BENCHMARK_CAPTURE(Call, bare, kBareObject, "target.call()", true)->Name("script_call_baseline");
// From the class at the root of the chain, the worst case of a search through classes.
BENCHMARK_CAPTURE(Call, bound_root, kElement, "target.hasChildNodes()", false)->Name("script_call_root");
BENCHMARK_CAPTURE(Call, bare_root, kBareObject, "target.call()", true)->Name("script_call_root_baseline");
BENCHMARK_CAPTURE(Call, bound_getter, kElement, "target.childElementCount", false)
    ->Name("script_call_getter");
BENCHMARK_CAPTURE(Call, bare_getter, kBareObject, "target.get", true)->Name("script_call_getter_baseline");

// --- Wrappers

constexpr size_t kNodes = 4096;

void WrapNode(benchmark::State& state) {
    ScriptPage page;
    JSContextRef context = page.context();
    for (auto _ : state) {
        state.PauseTiming();
        std::vector<qsl::RefPtr<dom::Element>> nodes;
        nodes.reserve(kNodes);
        for (size_t i = 0; i < kNodes; ++i)
            nodes.push_back(page.document().CreateElement("div"));
        state.ResumeTiming();
        for (const auto& node : nodes)
            benchmark::DoNotOptimize(script::ToScript(context, node.get()));
        state.PauseTiming();
        nodes.clear();
        script::CollectGarbageNow(context);
        state.ResumeTiming();
    }
    state.counters["target"] = 1.5;
}
BENCHMARK(WrapNode)->Name("wrap_node")->Iterations(100);

void MakeObject(benchmark::State& state) {
    ScriptPage page;
    JSContextRef context = page.context();
    JSClassDefinition definition = kJSClassDefinitionEmpty;
    definition.className = "Bare";
    JSClassRef bare_class = JSClassCreate(&definition);
    int native = 0;
    for (auto _ : state) {
        for (size_t i = 0; i < kNodes; ++i)
            benchmark::DoNotOptimize(JSObjectMake(context, bare_class, &native));
        state.PauseTiming();
        script::CollectGarbageNow(context);
        state.ResumeTiming();
    }
    JSClassRelease(bare_class);
}
BENCHMARK(MakeObject)->Name("wrap_node_baseline")->Iterations(100);

}  // namespace
