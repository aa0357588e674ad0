#include "script/class_installation.h"

#include <JavaScriptCore/JavaScript.h>

#include <algorithm>
#include <array>
#include <span>

#include "script/class_description.h"
#include "script/engine_seam.h"
#include "script/evaluate.h"
#include "script/native_private.h"
#include "script/script_name.h"

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

// On the stack, where the collector sees what stands in it.
constexpr size_t kBatch = 32;
template <class T>
using Batch = std::array<T, kBatch>;

class Installer {
  public:
    explicit Installer(ScriptingContext& page) : page_(page), context_(page.context) {}

    // Install and PrototypeOf as functions of the script engine, to be called from outside of it: all that
    // they call is nested then and spares the way in, which takes the clock twice for the time limit of
    // scripts. The engine lets go of its lock for a callback: it is taken once here, and not by each of some
    // hundred calls.
    static JSValueRef InstallInside(JSContextRef context, JSObjectRef, JSObjectRef, size_t,
                                    const JSValueRef[], JSValueRef*) {
        const ScriptEngineLock lock(context);
        if (ScriptingContext* page = GetScriptingContext(context)) Installer(*page).Install();
        return JSValueMakeUndefined(context);
    }
    static JSValueRef PrototypeInside(JSContextRef context, JSObjectRef, JSObjectRef, size_t count,
                                      const JSValueRef arguments[], JSValueRef* exception) {
        const ScriptEngineLock lock(context);
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
        const JSValueRef constructor[] = {prototype, Tool(ClassTool::ConstructorKey),
                                          Tool(ClassTool::ConstructorAccessor)};
        Call(AsObject(context_, Tool(ClassTool::DefineProperty)), constructor);
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
        if (!page || !page->class_keeper) return undefined;
        const auto* name = static_cast<const LazyClassName*>(JSObjectGetPrivate(function));
        Installer installer(*page);
        const JSValueRef value = count > 0 ? arguments[0] : installer.ConstructorOf(name->script_class);
        if (value) installer.DefineValue(page->global_object, name->name, ClassTool::HiddenValue, value);
        if (installer.exception()) *exception = installer.exception();
        return value && count == 0 ? value : undefined;
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
        const JSValueRef object_prototype = Get(object, "prototype");
        KeepTool(ClassTool::DefineGetter, Get(object_prototype, "__defineGetter__"));
        KeepTool(ClassTool::DefineSetter, Get(object_prototype, "__defineSetter__"));
        KeepTool(ClassTool::HiddenAccessor, MakeDescriptor(true, false));
        KeepTool(ClassTool::HiddenValue, MakeDescriptor(false, false));
        KeepTool(ClassTool::Method, MakeDescriptor(false, true));
        for (const auto& [tool, name] :
             {std::pair(ClassTool::GetKey, "get"), std::pair(ClassTool::SetKey, "set"),
              std::pair(ClassTool::ValueKey, "value"), std::pair(ClassTool::ConstructorKey, "constructor")})
            KeepTool(tool, JSValueMakeString(context_, ScriptName(name)));
        const ScriptName name("constructor");
        KeepTool(ClassTool::ConstructorAccessor, MakeDescriptor(true, false));
        SetOf(Tool(ClassTool::ConstructorAccessor), ClassTool::GetKey, MakeFunction(name, GetConstructor));
        SetOf(Tool(ClassTool::ConstructorAccessor), ClassTool::SetKey, MakeFunction(name, SetConstructor));
        KeepTool(ClassTool::MakePrototype,
                 JSObjectMakeFunctionWithCallback(context_, nullptr, PrototypeInside));
    }

    void InstallNames() {
        auto& names = page_.class_names;
        names.reserve(2 * kScriptClassCount);  // they stay in their place
        Vector<JSChar> json;                   // as for ScriptName
        const auto append = [&](std::string_view text) { json.insert(json.end(), text.begin(), text.end()); };
        const auto add = [&](const char* name, ScriptClass script_class) {
            append(json.empty() ? "[\"" : ",\"");
            append(name);
            append("\"");
            names.push_back({name, script_class});
        };
        for (size_t i = 0; i < kScriptClassCount; ++i) {
            const auto script_class = static_cast<ScriptClass>(i);
            const ClassDescription* description = GetClassDescription(script_class);
            if (description && !description->has_global_name) continue;
            add(kScriptClassRows[i].name, script_class);
            if (description && description->alias) add(description->alias, script_class);
        }
        append("]");
        DefineNames(ScriptName(json.data(), json.size()));
    }

    // A hundred names as one text, and objects that can be called: a string of the engine and a function for
    // each would take twice as long.
    void DefineNames(JSStringRef json) {
        JSClassDefinition definition = kJSClassDefinitionEmpty;
        definition.attributes = kJSClassAttributeNoAutomaticPrototype;
        definition.callAsFunction = AccessName;
        JSClassRef accessor_class = JSClassCreate(&definition);
        const JSObjectRef list = AsObject(context_, JSValueMakeFromJSONString(context_, json));
        for (size_t i = 0; list && i < page_.class_names.size(); ++i) {
            const JSValueRef name =
                JSObjectGetPropertyAtIndex(context_, list, static_cast<unsigned>(i), &exception_);
            // One for both ways: a setter has an argument.
            const JSObjectRef access = JSObjectMake(context_, accessor_class, &page_.class_names[i]);
            SetOf(Tool(ClassTool::HiddenAccessor), ClassTool::GetKey, access);
            SetOf(Tool(ClassTool::HiddenAccessor), ClassTool::SetKey, access);
            const JSValueRef arguments[] = {page_.global_object, name, Tool(ClassTool::HiddenAccessor)};
            Call(AsObject(context_, Tool(ClassTool::DefineProperty)), arguments);
        }
        JSClassRelease(accessor_class);
    }

    // The names of some rows as script strings at a time. A step is done for the whole batch before the next
    // one: each runs through some ten kilobytes of the engine's code, and all of them one after the other
    // through more than the processor's nearest cache holds.
    template <class Row, class F>
    static void InBatches(std::span<Row> rows, F&& use) {
        while (!rows.empty()) {
            const std::span<Row> batch = rows.first(std::min(rows.size(), kBatch));
            ScriptName names[kBatch];
            for (size_t i = 0; i < batch.size(); ++i)
                names[i].Set(batch[i].name);
            use(batch, names);
            rows = rows.subspan(batch.size());
        }
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
        return CallOn(nullptr, function, arguments);
    }

    JSValueRef CallOn(JSObjectRef self, JSObjectRef function, std::span<const JSValueRef> arguments) {
        if (!function || exception_) return nullptr;
        const JSValueRef result =
            JSObjectCallAsFunction(context_, function, self, arguments.size(), arguments.data(), &exception_);
        return exception_ ? nullptr : result;
    }

    void DefineProperty(JSObjectRef target, JSStringRef name, JSValueRef descriptor) {
        const JSValueRef arguments[] = {target, JSValueMakeString(context_, name), descriptor};
        Call(AsObject(context_, Tool(ClassTool::DefineProperty)), arguments);
    }

    void DefineValue(JSObjectRef target, const char* name, ClassTool descriptor, JSValueRef value) {
        SetOf(Tool(descriptor), ClassTool::ValueKey, value);
        DefineProperty(target, ScriptName(name), Tool(descriptor));
        SetOf(Tool(descriptor), ClassTool::ValueKey, JSValueMakeUndefined(context_));
    }

    // By a key that is there already: a name would become a string of the engine each time.
    void SetOf(JSValueRef descriptor, ClassTool key, JSValueRef value) {
        JSObjectSetPropertyForKey(context_, AsObject(context_, descriptor), Tool(key), value,
                                  kJSPropertyAttributeNone, nullptr);
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
        DefineMethods(target, description.methods);
        InBatches(description.attributes, [&](auto attributes, const ScriptName* names) {
            Batch<ScriptAccessor> made;
            DefineAccessors(target, MakeAccessors(attributes, names, made));
        });
        if (!description.shared_attributes.empty()) DefineShared(target, description.shared_attributes);
        for (const ConstantDescription& constant : description.constants) {
            JSObjectSetProperty(context_, target, ScriptName(constant.name),
                                JSValueMakeNumber(context_, constant.value), kConstant, &exception_);
        }
    }

    void DefineMethods(JSObjectRef target, std::span<const MethodDescription> methods) {
        InBatches(methods, [&](auto batch, const ScriptName* names) {
            Batch<JSObjectRef> functions;
            for (size_t i = 0; i < batch.size(); ++i)
                functions[i] = MakeFunction(names[i], batch[i].callback);
            for (size_t i = 0; i < batch.size(); ++i)
                JSObjectSetProperty(context_, target, names[i], functions[i], kJSPropertyAttributeNone,
                                    &exception_);
        });
    }

    std::span<ScriptAccessor> MakeAccessors(std::span<const AttributeDescription> attributes,
                                            const ScriptName* names, Batch<ScriptAccessor>& out) {
        for (size_t i = 0; i < attributes.size(); ++i)
            out[i].name = JSValueMakeString(context_, names[i]);
        for (size_t i = 0; i < attributes.size(); ++i) {
            out[i].getter = MakeFunction(names[i], attributes[i].getter);
            out[i].setter = MakeFunction(names[i], attributes[i].setter);
        }
        return {out.data(), attributes.size()};
    }

    // Not by descriptor: the engine asks one for six properties each time.
    void DefineAccessors(JSObjectRef target, std::span<const ScriptAccessor> accessors) {
        const auto define = [&](ClassTool tool, const ScriptAccessor& accessor, JSObjectRef function) {
            const JSValueRef arguments[] = {accessor.name, function};
            CallOn(target, AsObject(context_, Tool(tool)), arguments);
        };
        for (const ScriptAccessor& accessor : accessors)
            define(ClassTool::DefineGetter, accessor, accessor.getter);
        for (const ScriptAccessor& accessor : accessors) {
            if (accessor.setter) define(ClassTool::DefineSetter, accessor, accessor.setter);
        }
    }

    // The first class that comes makes them.
    void DefineShared(JSObjectRef target, std::span<const AttributeDescription> attributes) {
        auto& shared = page_.shared_accessors;
        if (shared.empty()) {
            InBatches(attributes, [&](auto batch, const ScriptName* names) {
                Batch<ScriptAccessor> made;
                const std::span<ScriptAccessor> accessors = MakeAccessors(batch, names, made);
                KeepAccessors(accessors);
                shared.insert(shared.end(), accessors.begin(), accessors.end());
            });
        }
        DefineAccessors(target, {shared.data(), shared.size()});
    }

    // In an array, the last batch with the one before it.
    void KeepAccessors(std::span<const ScriptAccessor> accessors) {
        std::array<JSValueRef, 3 * kBatch + 1> values;
        size_t count = 0;
        for (const ScriptAccessor& accessor : accessors) {
            values[count++] = accessor.name;
            values[count++] = accessor.getter;
            if (accessor.setter) values[count++] = accessor.setter;
        }
        if (Tool(ClassTool::SharedAccessors)) values[count++] = Tool(ClassTool::SharedAccessors);
        KeepTool(ClassTool::SharedAccessors, JSObjectMakeArray(context_, count, values.data(), &exception_));
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
    page.shared_accessors = {};
}

}  // namespace qorvex::script
