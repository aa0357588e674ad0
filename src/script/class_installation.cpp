#include "script/class_installation.h"

#include <JavaScriptCore/JavaScript.h>

#include "script/class_description.h"
#include "script/engine_seam.h"
#include "script/evaluate.h"
#include "script/native_private.h"

namespace qorvex::script {

namespace {

// Gives the functions that build classes, in the order of ClassBuilder; what they are handed is what the C
// API cannot express. They run whenever a class is first used, so they keep what they need of the language
// before any script of the page can change it. Descriptors are kept as well: making one costs more than
// defining a property with it.
constexpr std::string_view kBuilders = R"('use strict'; {
    const global = globalThis;
    let build;
    const { defineProperty, create, setPrototypeOf, prototype: root } = Object;
    const { toStringTag, hasInstance, iterator } = Symbol;
    const { values: walkArray } = Array.prototype;
    const { apply } = Reflect;
    const instanceOf = Function.prototype[hasInstance];
    const kind = (writable, enumerable, configurable) =>
        ({ __proto__: null, value: undefined, writable, enumerable, configurable });
    const access = enumerable =>
        ({ __proto__: null, get: undefined, set: undefined, enumerable, configurable: true });
    const accessor = access(true), hiddenAccessor = access(false);
    const method = kind(true, true, true), constant = kind(false, true, false), fixed = kind(false, false, false);
    const hidden = kind(true, false, true), label = kind(false, false, true);
    function define(target, key, descriptor, value) {
        descriptor.value = value;
        defineProperty(target, key, descriptor);
        descriptor.value = undefined;
    }
    function defineHidden(target, key, get, set) {
        hiddenAccessor.get = get;
        hiddenAccessor.set = set;
        defineProperty(target, key, hiddenAccessor);
    }
    function constants(target, values, i) {
        for (; i < values.length; i += 2) define(target, values[i], constant, values[i + 1]);
    }
    [
        // A global name whose class is made when it is read; `make` does that.
        function lazy(make, ...names) {
            build = make;
            for (let i = 0; i < names.length; i += 2) {
                const name = names[i], index = names[i + 1];
                defineHidden(global, name, () => {
                    const made = build(index);
                    define(global, name, hidden, made);
                    return made;
                }, value => define(global, name, hidden, value));
            }
        },
        // Its constructor costs more than the rest of it, and a page asks for few.
        function prototypeOf(parent, name, index, list) {
            const result = create(parent || root);
            define(result, toStringTag, label, name);
            if (list) define(result, iterator, hidden, walkArray);
            defineHidden(result, 'constructor', () => build(index),
                function(value) { define(this, 'constructor', this === result ? hidden : method, value); });
            return result;
        },
        // Name, getter and setter of each attribute; name and value of constants.
        function members(target, attributes, ...values) {
            let i = 0;
            for (; attributes > 0; --attributes, i += 3) {
                accessor.get = values[i + 1];
                accessor.set = values[i + 2];
                defineProperty(target, values[i], accessor);
            }
            constants(target, values, i);
        },
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
            constants(result, values, 0);
            return result;
        },
        // Sixteen objects that inherit from `prototype`, handed over in one call.
        function blanksOf(prototype, take) {
            function Blank() {}
            Blank.prototype = prototype;
            return () => take(new Blank, new Blank, new Blank, new Blank, new Blank, new Blank, new Blank, new Blank,
                              new Blank, new Blank, new Blank, new Blank, new Blank, new Blank, new Blank, new Blank);
        },
        function tagGlobal(name) { define(global, toStringTag, label, name); }
    ];
})";

JSValueRef InvalidConstructor(JSContextRef context, JSObjectRef, JSObjectRef, size_t, const JSValueRef[],
                              JSValueRef* exception) {
    RaiseError(context, "Invalid constructor!", exception);
    return JSObjectMake(context, nullptr, nullptr);
}

// Where the object that holds all of a page keeps what.
constexpr size_t kPrototypesAt = 0;
constexpr size_t kConstructorsAt = kScriptClassCount;
constexpr size_t kBuildersAt = 2 * kScriptClassCount;

// Arguments of a call, on the stack, where the collector sees them.
class Arguments {
  public:
    explicit Arguments(JSContextRef context) : context_(context) {}
    void Add(JSValueRef value) { values_[count_++] = value; }
    void Add(const char* text) {
        JSStringRef string = JSStringCreateWithUTF8CString(text);
        Add(JSValueMakeString(context_, string));
        JSStringRelease(string);
    }
    void Add(double number) { Add(JSValueMakeNumber(context_, number)); }
    // A function of that name, or undefined for a null callback.
    void Add(JSStringRef name, JSObjectCallAsFunctionCallback callback) {
        Add(callback ? JSObjectMakeFunctionWithCallback(context_, name, callback)
                     : JSValueMakeUndefined(context_));
    }
    // Room for a few more of the same.
    [[nodiscard]] bool IsFull() const { return count_ + 4 > kMost; }
    [[nodiscard]] std::span<const JSValueRef> values() const { return {values_, count_}; }
    [[nodiscard]] size_t count() const { return count_; }
    void Set(size_t index, double number) { values_[index] = JSValueMakeNumber(context_, number); }

  private:
    static constexpr size_t kMost = 256;
    JSContextRef context_;
    size_t count_ = 0;
    JSValueRef values_[kMost];
};

class Installer {
  public:
    explicit Installer(ScriptingContext& page) : page_(page), context_(page.context) {}

    void Install() {
        const ScriptEngineLock lock(context_);
        // Without a prototype: a page can change what an array does with its entries.
        page_.class_keeper = JSObjectMake(context_, nullptr, nullptr);
        JSObjectSetPrototype(context_, page_.class_keeper, JSValueMakeNull(context_));
        JSValueProtect(context_, page_.class_keeper);
        MakeBuilders();
        InstallNames();
        // The global object's prototype cannot be changed: what its classes have stands on itself.
        for (const ScriptClass script_class : {ScriptClass::EventTarget, ScriptClass::Window}) {
            if (const ClassDescription* description = GetClassDescription(script_class))
                DefineMembers(page_.global_object, *description);
        }
        Arguments tag(context_);
        tag.Add(GetScriptClassRow(ScriptClass::Window).name);
        Call(ClassBuilder::TagGlobal, tag);
    }

    // Null when script cannot run now.
    JSObjectRef PrototypeOf(ScriptClass script_class) {
        const auto index = static_cast<size_t>(script_class);
        if (script_class == ScriptClass::None || !page_.class_keeper) return nullptr;
        if (page_.prototypes[index]) return page_.prototypes[index];
        const ScriptEngineLock lock(context_);
        const ScriptClass parent = GetScriptClassRow(script_class).parent;
        const JSObjectRef parent_prototype = PrototypeOf(parent);
        if (parent != ScriptClass::None && !parent_prototype) return nullptr;
        Arguments arguments(context_);
        arguments.Add(parent_prototype ? parent_prototype : JSValueMakeNull(context_));
        arguments.Add(GetScriptClassRow(script_class).name);
        arguments.Add(static_cast<double>(index));
        const ClassDescription* description = GetClassDescription(script_class);
        arguments.Add(JSValueMakeBoolean(context_, description && description->properties.indexed));
        const JSObjectRef prototype = AsObject(context_, Call(ClassBuilder::PrototypeOf, arguments));
        if (!prototype) return nullptr;
        // The window's own stand on the global object.
        const bool has_members = description && script_class != ScriptClass::Window;
        if (has_members && !DefineMembers(prototype, *description)) return nullptr;
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
        const ScriptEngineLock lock(context_);
        const JSObjectRef constructor = MakeConstructor(script_class, prototype);
        if (constructor) Keep(at, constructor);
        return constructor;
    }

    [[nodiscard]] JSValueRef exception() const { return exception_; }

  private:
    // The getter of a global name: gives the constructor.
    static JSValueRef BuildClass(JSContextRef context, JSObjectRef, JSObjectRef, size_t,
                                 const JSValueRef arguments[], JSValueRef* exception) {
        ScriptingContext* page = GetScriptingContext(context);
        if (!page) return JSValueMakeUndefined(context);
        Installer installer(*page);
        const double index = JSValueToNumber(context, arguments[0], nullptr);
        const JSObjectRef made = installer.ConstructorOf(static_cast<ScriptClass>(index));
        if (!made) *exception = installer.exception();
        return made ? made : JSValueMakeUndefined(context);
    }

    void MakeBuilders() {
        JSStringRef source = JSStringCreateWithUTF8CString(kBuilders.data());
        const JSObjectRef builders =
            AsObject(context_, JSEvaluateScript(context_, source, nullptr, nullptr, 0, nullptr));
        JSStringRelease(source);
        for (size_t i = 0; i < page_.builders.size(); ++i) {
            page_.builders[i] = AsObject(
                context_, JSObjectGetPropertyAtIndex(context_, builders, static_cast<unsigned>(i), nullptr));
        }
        Keep(kBuildersAt, builders);
    }

    void InstallNames() {
        Arguments names(context_);
        names.Add(nullptr, BuildClass);
        for (size_t i = 0; i < kScriptClassCount; ++i) {
            const ClassDescription* description = GetClassDescription(static_cast<ScriptClass>(i));
            if (description && !description->has_global_name) continue;
            names.Add(kScriptClassRows[i].name);
            names.Add(static_cast<double>(i));
            if (!description || !description->alias) continue;
            names.Add(description->alias);
            names.Add(static_cast<double>(i));
        }
        Call(ClassBuilder::Lazy, names);
    }

    void Keep(size_t index, JSValueRef value) {
        JSObjectSetPropertyAtIndex(context_, page_.class_keeper, static_cast<unsigned>(index), value,
                                   nullptr);
    }

    JSValueRef Call(ClassBuilder builder, const Arguments& arguments) {
        const auto values = arguments.values();
        const JSValueRef result =
            JSObjectCallAsFunction(context_, page_.builders[static_cast<size_t>(builder)], nullptr,
                                   values.size(), values.data(), &exception_);
        return exception_ ? nullptr : result;
    }

    // A plain assignment makes what the builder would, at half the cost.
    bool DefineMethods(JSObjectRef target, std::span<const MethodDescription> methods) {
        for (const MethodDescription& method : methods) {
            JSStringRef name = JSStringCreateWithUTF8CString(method.name);
            const JSObjectRef function = JSObjectMakeFunctionWithCallback(context_, name, method.callback);
            JSObjectSetProperty(context_, target, name, function, kJSPropertyAttributeNone, &exception_);
            JSStringRelease(name);
            if (exception_) return false;
        }
        return true;
    }

    bool DefineMembers(JSObjectRef target, const ClassDescription& description) {
        if (!DefineMethods(target, description.methods)) return false;
        auto attribute = description.attributes.begin();
        auto constant = description.constants.begin();
        // The largest classes take several calls.
        while (attribute != description.attributes.end() || constant != description.constants.end()) {
            Arguments arguments(context_);
            arguments.Add(target);
            arguments.Add(0.0);
            double attributes = 0;
            for (; attribute != description.attributes.end() && !arguments.IsFull();
                 ++attribute, ++attributes) {
                JSStringRef name = JSStringCreateWithUTF8CString(attribute->name);
                arguments.Add(JSValueMakeString(context_, name));
                arguments.Add(name, attribute->getter);
                arguments.Add(name, attribute->setter);
                JSStringRelease(name);
            }
            for (; constant != description.constants.end() && !arguments.IsFull(); ++constant) {
                arguments.Add(constant->name);
                arguments.Add(constant->value);
            }
            arguments.Set(1, attributes);
            if (!Call(ClassBuilder::Members, arguments)) return false;
        }
        return true;
    }

    JSObjectRef MakeConstructor(ScriptClass script_class, JSObjectRef prototype) {
        const ClassDescription* description = GetClassDescription(script_class);
        const ScriptClassRow& row = GetScriptClassRow(script_class);
        const JSObjectRef parent = ConstructorOf(row.parent);
        const bool constructs = description && description->construct;
        const bool answers_for_global = IsScriptClassOrDerived(ScriptClass::Window, script_class);
        Arguments arguments(context_);
        arguments.Add(row.name);
        arguments.Add(prototype);
        arguments.Add(parent ? parent : JSValueMakeNull(context_));
        arguments.Add(nullptr, constructs ? description->construct : InvalidConstructor);
        arguments.Add(JSValueMakeBoolean(context_, answers_for_global));
        for (const ConstantDescription& constant :
             description ? description->constants : std::span<const ConstantDescription>()) {
            arguments.Add(constant.name);
            arguments.Add(constant.value);
        }
        return AsObject(context_, Call(ClassBuilder::ConstructorOf, arguments));
    }

    ScriptingContext& page_;
    JSGlobalContextRef context_;
    JSValueRef exception_ = nullptr;
};

}  // namespace

void InstallClasses(ScriptingContext& page) {
    // On the stack, where the collector sees the objects it holds.
    Installer(page).Install();
}

JSObjectRef GetPrototype(ScriptingContext& page, ScriptClass script_class) {
    if (const JSObjectRef made = page.prototypes[static_cast<size_t>(script_class)]) return made;
    return Installer(page).PrototypeOf(script_class);
}

void UninstallClasses(ScriptingContext& page) {
    if (page.class_keeper) UnprotectUnlessTeardown(page.context, page.class_keeper);
    page.class_keeper = nullptr;
    page.prototypes = {};
    page.builders = {};
}

}  // namespace qorvex::script
