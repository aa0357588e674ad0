#include "script/class_installation.h"

#include <JavaScriptCore/JavaScript.h>

#include <algorithm>
#include <span>

#include "script/class_description.h"
#include "script/engine_seam.h"
#include "script/evaluate.h"
#include "script/native_private.h"

namespace qorvex::script {

namespace {

// What the C API cannot express, as a function of what it needs of the language: it runs when a class is
// first used, and by then scripts of the page may have changed what the global names stand for.
constexpr std::string_view kScriptTools = R"('use strict';
(function(global, defineProperty, setPrototypeOf, apply, instanceOf, hasInstance) {
    const kind = (writable, enumerable, configurable) =>
        ({ __proto__: null, value: undefined, writable, enumerable, configurable });
    const constant = kind(false, true, false), fixed = kind(false, false, false), hidden = kind(true, false, true);
    function define(target, key, descriptor, value) {
        descriptor.value = value;
        defineProperty(target, key, descriptor);
        descriptor.value = undefined;
    }
    return [
        function constructorOf(name, prototype, parent, construct, answersForGlobal, ...values) {
            const result = { [name]: function(...values) { return construct(new.target, ...values); } }[name];
            define(result, 'prototype', fixed, prototype);
            define(result, 'name', fixed, name);
            define(prototype, 'constructor', hidden, result);
            if (parent) setPrototypeOf(result, parent);
            if (answersForGlobal) {
                define(result, hasInstance, fixed,
                    function(value) { return value === global || apply(instanceOf, this, [value]); });
            }
            for (let i = 0; i < values.length; i += 2) define(result, values[i], constant, values[i + 1]);
            return result;
        },
        // Sixteen objects a round that inherit from `prototype`, handed over in one call.
        function blanksOf(prototype, take) {
            function Blank() {}
            Blank.prototype = prototype;
            return rounds => {
                do take(new Blank, new Blank, new Blank, new Blank, new Blank, new Blank, new Blank, new Blank,
                        new Blank, new Blank, new Blank, new Blank, new Blank, new Blank, new Blank, new Blank);
                while (--rounds > 0);
            };
        }
    ];
}))";

constexpr JSPropertyAttributes kConstant = kJSPropertyAttributeReadOnly | kJSPropertyAttributeDontDelete;
constexpr JSPropertyAttributes kLabel = kJSPropertyAttributeReadOnly | kJSPropertyAttributeDontEnum;

JSValueRef InvalidConstructor(JSContextRef context, JSObjectRef, JSObjectRef, size_t, const JSValueRef[],
                              JSValueRef* exception) {
    RaiseError(context, "Invalid constructor!", exception);
    return JSObjectMake(context, nullptr, nullptr);
}

// Where the object that holds all of a page keeps what.
constexpr size_t kPrototypesAt = 0;
constexpr size_t kConstructorsAt = kScriptClassCount;
constexpr size_t kToolsAt = 2 * kScriptClassCount;

class ScriptName {
  public:
    explicit ScriptName(const char* text) : string_(JSStringCreateWithUTF8CString(text)) {}
    ~ScriptName() { JSStringRelease(string_); }
    ScriptName(const ScriptName&) = delete;
    ScriptName& operator=(const ScriptName&) = delete;
    operator JSStringRef() const { return string_; }  // NOLINT: implicit by design

  private:
    JSStringRef string_;
};

class Installer {
  public:
    explicit Installer(ScriptingContext& page) : page_(page), context_(page.context) {}

    // Install and PrototypeOf as functions of the script engine, to be called from outside of it: all that
    // they call is nested then and spares the way in, which takes the clock twice for the time limit of
    // scripts.
    static JSValueRef InstallInside(JSContextRef context, JSObjectRef, JSObjectRef, size_t,
                                    const JSValueRef[], JSValueRef*) {
        if (ScriptingContext* page = GetScriptingContext(context)) Installer(*page).Install();
        return JSValueMakeUndefined(context);
    }
    static JSValueRef PrototypeInside(JSContextRef context, JSObjectRef, JSObjectRef, size_t count,
                                      const JSValueRef arguments[], JSValueRef* exception) {
        const JSValueRef undefined = JSValueMakeUndefined(context);
        ScriptingContext* page = GetScriptingContext(context);
        const double number = count > 0 ? JSValueToNumber(context, arguments[0], nullptr) : -1;
        if (!page || !(number >= 0 && number < kScriptClassCount)) return undefined;
        Installer installer(*page);
        const JSObjectRef made = installer.PrototypeOf(static_cast<ScriptClass>(number));
        if (installer.exception_) *exception = installer.exception_;
        return made ? made : undefined;
    }

    // From outside: calls PrototypeInside.
    JSObjectRef EnterForPrototype(ScriptClass script_class) {
        if (!page_.class_keeper) return nullptr;
        const ScriptEngineLock lock(context_);
        const JSValueRef number = JSValueMakeNumber(context_, static_cast<double>(script_class));
        return AsObject(context_, Call(AsObject(context_, Tool(ClassTool::MakePrototype)), {&number, 1}));
    }

    void Install() {
        // Without a prototype: a page can change what an array does with its entries.
        page_.class_keeper = MakeBare();
        JSValueProtect(context_, page_.class_keeper);
        KeepLanguage();
        InstallNames();
        // The global object's prototype cannot be changed: what its classes have stands on itself.
        for (const ScriptClass script_class : {ScriptClass::EventTarget, ScriptClass::Window}) {
            if (const ClassDescription* description = GetClassDescription(script_class))
                DefineMembers(page_.global_object, *description);
        }
        Label(page_.global_object, ScriptClass::Window);
    }

    // Null when script cannot run now.
    JSObjectRef PrototypeOf(ScriptClass script_class) {
        const auto index = static_cast<size_t>(script_class);
        if (script_class == ScriptClass::None || !page_.class_keeper) return nullptr;
        if (page_.prototypes[index]) return page_.prototypes[index];
        const ScriptClass parent = GetScriptClassRow(script_class).parent;
        const JSObjectRef parent_prototype = PrototypeOf(parent);
        if (parent != ScriptClass::None && !parent_prototype) return nullptr;
        // Without a parent at first: the API looks there, too, before it defines a property, and would meet
        // what the page has put into Object.prototype.
        const JSObjectRef prototype = JSObjectMake(context_, nullptr, nullptr);
        const JSValueRef root = JSObjectGetPrototype(context_, prototype);
        JSObjectSetPrototype(context_, prototype, JSValueMakeNull(context_));
        Label(prototype, script_class);
        // Its constructor costs more than the rest of it, and a page asks for few.
        DefineAccessor(prototype, ScriptName("constructor"), Tool(ClassTool::HiddenAccessor),
                       Tool(ClassTool::ConstructorGetter), Tool(ClassTool::ConstructorSetter));
        const ClassDescription* description = GetClassDescription(script_class);
        if (description && description->properties.indexed) DefineIterator(prototype);
        // The window's own stand on the global object.
        const bool has_members = description && script_class != ScriptClass::Window;
        if (has_members) DefineMembers(prototype, *description);
        if (exception_) return nullptr;
        JSObjectSetPrototype(context_, prototype, parent_prototype ? parent_prototype : root);
        Keep(kPrototypesAt + index, prototype);
        return page_.prototypes[index] = prototype;
    }

    JSObjectRef ConstructorOf(ScriptClass script_class) {
        const JSObjectRef prototype = PrototypeOf(script_class);
        if (!prototype) return nullptr;
        const size_t at = kConstructorsAt + static_cast<size_t>(script_class);
        const JSValueRef kept =
            JSObjectGetPropertyAtIndex(context_, page_.class_keeper, static_cast<unsigned>(at), nullptr);
        if (const JSObjectRef made = AsObject(context_, kept)) return made;
        const JSObjectRef constructor = MakeConstructor(script_class, prototype);
        if (constructor) Keep(at, constructor);
        return constructor;
    }

    JSObjectRef MakeBlankMaker(JSObjectRef prototype, JSObjectRef take) {
        const JSValueRef arguments[] = {prototype, take};
        return AsObject(context_, Call(ScriptTool(ClassTool::BlanksOf), arguments));
    }

    [[nodiscard]] JSValueRef exception() const { return exception_; }

  private:
    // Reads a global name that stands for a class, without an argument, or writes it.
    static JSValueRef AccessName(JSContextRef context, JSObjectRef function, JSObjectRef, size_t count,
                                 const JSValueRef arguments[], JSValueRef* exception) {
        const JSValueRef undefined = JSValueMakeUndefined(context);
        ScriptingContext* page = GetScriptingContext(context);
        if (!page) return undefined;
        for (const LazyClassName& name : page->class_names) {
            if (name.accessor != function) continue;
            Installer installer(*page);
            const JSValueRef value = count > 0 ? arguments[0] : installer.ConstructorOf(name.script_class);
            if (value) installer.DefineValue(page->global_object, name.name, ClassTool::HiddenValue, value);
            if (installer.exception()) *exception = installer.exception();
            return value && count == 0 ? value : undefined;
        }
        return undefined;
    }

    // `constructor` of every prototype: the class is that of the first prototype on the way up from `this`.
    static JSValueRef GetConstructor(JSContextRef context, JSObjectRef, JSObjectRef this_object, size_t,
                                     const JSValueRef[], JSValueRef* exception) {
        ScriptingContext* page = GetScriptingContext(context);
        JSObjectRef object = page ? this_object : nullptr;
        // A page can make chains of any length.
        for (int steps = 0; object && steps < kLongestChain; ++steps) {
            const ScriptClass script_class = ClassOfPrototype(*page, object);
            if (script_class != ScriptClass::None) {
                Installer installer(*page);
                const JSObjectRef made = installer.ConstructorOf(script_class);
                if (!made) *exception = installer.exception();
                return made ? made : JSValueMakeUndefined(context);
            }
            object = AsObject(context, JSObjectGetPrototype(context, object));
        }
        return JSValueMakeUndefined(context);
    }

    static JSValueRef SetConstructor(JSContextRef context, JSObjectRef, JSObjectRef this_object, size_t count,
                                     const JSValueRef arguments[], JSValueRef* exception) {
        ScriptingContext* page = GetScriptingContext(context);
        if (!page || count == 0) return JSValueMakeUndefined(context);
        Installer installer(*page);
        const bool own = ClassOfPrototype(*page, this_object) != ScriptClass::None;
        installer.DefineValue(this_object, "constructor", own ? ClassTool::HiddenValue : ClassTool::Method,
                              arguments[0]);
        if (installer.exception()) *exception = installer.exception();
        return JSValueMakeUndefined(context);
    }

    static ScriptClass ClassOfPrototype(const ScriptingContext& page, JSObjectRef object) {
        const auto found = std::find(page.prototypes.begin(), page.prototypes.end(), object);
        return found == page.prototypes.end() ? ScriptClass::None
                                              : static_cast<ScriptClass>(found - page.prototypes.begin());
    }

    JSObjectRef MakeBare() {
        const JSObjectRef object = JSObjectMake(context_, nullptr, nullptr);
        JSObjectSetPrototype(context_, object, JSValueMakeNull(context_));
        return object;
    }

    JSValueRef Get(JSValueRef object, const char* name) {
        return JSObjectGetProperty(context_, AsObject(context_, object), ScriptName(name), &exception_);
    }

    JSObjectRef MakeDescriptor(bool accessor, bool enumerable) {
        const JSObjectRef descriptor = MakeBare();
        const auto set = [&](const char* name, JSValueRef value) {
            JSObjectSetProperty(context_, descriptor, ScriptName(name), value, kJSPropertyAttributeNone,
                                &exception_);
        };
        set("configurable", JSValueMakeBoolean(context_, true));
        set("enumerable", JSValueMakeBoolean(context_, enumerable));
        if (!accessor) set("writable", JSValueMakeBoolean(context_, true));
        return descriptor;
    }

    // Before any script of the page.
    void KeepLanguage() {
        const JSValueRef object = Get(page_.global_object, "Object");
        const JSValueRef symbol = Get(page_.global_object, "Symbol");
        const JSValueRef has_instance = Get(symbol, "hasInstance");
        const JSValueRef function_prototype = Get(Get(page_.global_object, "Function"), "prototype");
        KeepTool(ClassTool::DefineProperty, Get(object, "defineProperty"));
        KeepTool(ClassTool::SetPrototypeOf, Get(object, "setPrototypeOf"));
        KeepTool(ClassTool::Apply, Get(Get(page_.global_object, "Reflect"), "apply"));
        KeepTool(ClassTool::HasInstance, has_instance);
        KeepTool(ClassTool::InstanceOf,
                 JSObjectGetPropertyForKey(context_, AsObject(context_, function_prototype), has_instance,
                                           &exception_));
        KeepTool(ClassTool::ToStringTag, Get(symbol, "toStringTag"));
        KeepTool(ClassTool::Iterator, Get(symbol, "iterator"));
        KeepTool(ClassTool::WalkArray, Get(Get(Get(page_.global_object, "Array"), "prototype"), "values"));
        KeepTool(ClassTool::Accessor, MakeDescriptor(true, true));
        KeepTool(ClassTool::HiddenAccessor, MakeDescriptor(true, false));
        KeepTool(ClassTool::HiddenValue, MakeDescriptor(false, false));
        KeepTool(ClassTool::Method, MakeDescriptor(false, true));
        const ScriptName name("constructor");
        KeepTool(ClassTool::ConstructorGetter,
                 JSObjectMakeFunctionWithCallback(context_, name, GetConstructor));
        KeepTool(ClassTool::ConstructorSetter,
                 JSObjectMakeFunctionWithCallback(context_, name, SetConstructor));
        KeepTool(ClassTool::MakePrototype,
                 JSObjectMakeFunctionWithCallback(context_, nullptr, PrototypeInside));
    }

    void InstallNames() {
        page_.class_names.reserve(kScriptClassCount);
        for (size_t i = 0; i < kScriptClassCount; ++i) {
            const auto script_class = static_cast<ScriptClass>(i);
            const ClassDescription* description = GetClassDescription(script_class);
            if (description && !description->has_global_name) continue;
            InstallName(kScriptClassRows[i].name, script_class);
            if (description && description->alias) InstallName(description->alias, script_class);
        }
    }

    void InstallName(const char* name, ScriptClass script_class) {
        // One function for both ways: a setter has an argument.
        const ScriptName text(name);
        const JSObjectRef access = JSObjectMakeFunctionWithCallback(context_, text, AccessName);
        page_.class_names.push_back({access, name, script_class});
        DefineAccessor(page_.global_object, text, Tool(ClassTool::HiddenAccessor), access, access);
    }

    void Keep(size_t index, JSValueRef value) {
        JSObjectSetPropertyAtIndex(context_, page_.class_keeper, static_cast<unsigned>(index), value,
                                   nullptr);
    }

    void KeepTool(ClassTool tool, JSValueRef value) {
        Keep(kToolsAt + static_cast<size_t>(tool), value);
        page_.class_tools[static_cast<size_t>(tool)] = value;
    }

    JSValueRef Tool(ClassTool tool) const { return page_.class_tools[static_cast<size_t>(tool)]; }

    // One of those in script. Null when script cannot run now.
    JSObjectRef ScriptTool(ClassTool tool) {
        if (!Tool(tool)) MakeScriptTools();
        return AsObject(context_, Tool(tool));
    }

    void MakeScriptTools() {
        const JSValueRef make =
            JSEvaluateScript(context_, ScriptName(kScriptTools.data()), nullptr, nullptr, 0, &exception_);
        const JSValueRef language[] = {
            page_.global_object,    Tool(ClassTool::DefineProperty), Tool(ClassTool::SetPrototypeOf),
            Tool(ClassTool::Apply), Tool(ClassTool::InstanceOf),     Tool(ClassTool::HasInstance)};
        const JSObjectRef tools = AsObject(context_, Call(AsObject(context_, make), language));
        if (!tools) return;
        KeepTool(ClassTool::ConstructorOf, JSObjectGetPropertyAtIndex(context_, tools, 0, nullptr));
        KeepTool(ClassTool::BlanksOf, JSObjectGetPropertyAtIndex(context_, tools, 1, nullptr));
    }

    JSValueRef Call(JSObjectRef function, std::span<const JSValueRef> arguments) {
        if (!function || exception_) return nullptr;
        const JSValueRef result = JSObjectCallAsFunction(context_, function, nullptr, arguments.size(),
                                                         arguments.data(), &exception_);
        return exception_ ? nullptr : result;
    }

    void DefineProperty(JSObjectRef target, JSStringRef name, JSValueRef descriptor) {
        const JSValueRef arguments[] = {target, JSValueMakeString(context_, name), descriptor};
        Call(AsObject(context_, Tool(ClassTool::DefineProperty)), arguments);
    }

    // The descriptors are there for all: only what differs is set. Null stands for no function.
    void DefineAccessor(JSObjectRef target, JSStringRef name, JSValueRef descriptor, JSValueRef getter,
                        JSValueRef setter) {
        const JSValueRef undefined = JSValueMakeUndefined(context_);
        SetOf(descriptor, get_, getter ? getter : undefined);
        SetOf(descriptor, set_, setter ? setter : undefined);
        DefineProperty(target, name, descriptor);
    }

    void DefineValue(JSObjectRef target, const char* name, ClassTool descriptor, JSValueRef value) {
        SetOf(Tool(descriptor), value_, value);
        DefineProperty(target, ScriptName(name), Tool(descriptor));
        SetOf(Tool(descriptor), value_, JSValueMakeUndefined(context_));
    }

    void SetOf(JSValueRef descriptor, JSStringRef name, JSValueRef value) {
        JSObjectSetProperty(context_, AsObject(context_, descriptor), name, value, kJSPropertyAttributeNone,
                            nullptr);
    }

    void Label(JSObjectRef target, ScriptClass script_class) {
        const ScriptName name(GetScriptClassRow(script_class).name);
        JSObjectSetPropertyForKey(context_, target, Tool(ClassTool::ToStringTag),
                                  JSValueMakeString(context_, name), kLabel, &exception_);
    }

    // Lists are walked as arrays are.
    void DefineIterator(JSObjectRef target) {
        JSObjectSetPropertyForKey(context_, target, Tool(ClassTool::Iterator), Tool(ClassTool::WalkArray),
                                  kJSPropertyAttributeDontEnum, &exception_);
    }

    JSObjectRef MakeFunction(JSStringRef name, JSObjectCallAsFunctionCallback callback) {
        return callback ? JSObjectMakeFunctionWithCallback(context_, name, callback) : nullptr;
    }

    void DefineMembers(JSObjectRef target, const ClassDescription& description) {
        for (const MethodDescription& method : description.methods) {
            const ScriptName name(method.name);
            JSObjectSetProperty(context_, target, name, MakeFunction(name, method.callback),
                                kJSPropertyAttributeNone, &exception_);
        }
        for (const AttributeDescription& attribute : description.attributes) {
            const ScriptName name(attribute.name);
            DefineAccessor(target, name, Tool(ClassTool::Accessor), MakeFunction(name, attribute.getter),
                           MakeFunction(name, attribute.setter));
        }
        for (const ConstantDescription& constant : description.constants) {
            JSObjectSetProperty(context_, target, ScriptName(constant.name),
                                JSValueMakeNumber(context_, constant.value), kConstant, &exception_);
        }
    }

    JSObjectRef MakeConstructor(ScriptClass script_class, JSObjectRef prototype) {
        const ClassDescription* description = GetClassDescription(script_class);
        const ScriptClassRow& row = GetScriptClassRow(script_class);
        const JSObjectRef parent = ConstructorOf(row.parent);
        const bool constructs = description && description->construct;
        const bool answers_for_global = IsScriptClassOrDerived(ScriptClass::Window, script_class);
        // On the stack, where the collector sees them.
        constexpr size_t kMost = 256;
        JSValueRef arguments[kMost] = {
            JSValueMakeString(context_, ScriptName(row.name)), prototype,
            parent ? parent : JSValueMakeNull(context_),
            MakeFunction(nullptr, constructs ? description->construct : InvalidConstructor),
            JSValueMakeBoolean(context_, answers_for_global)};
        size_t count = 5;
        for (const ConstantDescription& constant :
             description ? description->constants : std::span<const ConstantDescription>()) {
            if (count + 2 > kMost) break;
            arguments[count++] = JSValueMakeString(context_, ScriptName(constant.name));
            arguments[count++] = JSValueMakeNumber(context_, constant.value);
        }
        return AsObject(context_, Call(ScriptTool(ClassTool::ConstructorOf), {arguments, count}));
    }

    static constexpr int kLongestChain = 10000;

    ScriptingContext& page_;
    JSGlobalContextRef context_;
    JSValueRef exception_ = nullptr;
    const ScriptName get_{"get"}, set_{"set"}, value_{"value"};
};

}  // namespace

void InstallClasses(ScriptingContext& page) {
    const ScriptEngineLock lock(page.context);
    const JSObjectRef install =
        JSObjectMakeFunctionWithCallback(page.context, nullptr, Installer::InstallInside);
    JSObjectCallAsFunction(page.context, install, nullptr, 0, nullptr, nullptr);
}

JSObjectRef GetPrototype(ScriptingContext& page, ScriptClass script_class) {
    if (const JSObjectRef made = page.prototypes[static_cast<size_t>(script_class)]) return made;
    return Installer(page).EnterForPrototype(script_class);
}

JSObjectRef MakeBlankMaker(ScriptingContext& page, JSObjectRef prototype, JSObjectRef take) {
    return Installer(page).MakeBlankMaker(prototype, take);
}

void UninstallClasses(ScriptingContext& page) {
    if (page.class_keeper) UnprotectUnlessTeardown(page.context, page.class_keeper);
    page.class_keeper = nullptr;
    page.prototypes = {};
    page.class_tools = {};
    page.class_names = {};
}

}  // namespace qorvex::script
