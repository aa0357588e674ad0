#include "script/class_installation.h"

#include <JavaScriptCore/JavaScript.h>

#include "script/class_description.h"
#include "script/evaluate.h"

namespace qorvex::script {

namespace {

// Gives the functions that build classes; what they are handed is what the C API cannot express.
constexpr std::string_view kBuilders = R"((function() {
    'use strict';
    const fixed = value => ({ value, writable: false, enumerable: false, configurable: false });
    return {
        accessor(target, name, get, set) {
            Object.defineProperty(target, name, { get, set, enumerable: true, configurable: true });
        },
        constant(target, name, value) {
            Object.defineProperty(target, name, { value, writable: false, enumerable: true, configurable: false });
        },
        constructorOf(name, prototype, parent, construct, global) {
            const result = { [name]: function(...values) { return construct(new.target, ...values); } }[name];
            Object.defineProperties(result, { prototype: fixed(prototype), name: fixed(name) });
            Object.defineProperty(prototype, 'constructor',
                { value: result, writable: true, enumerable: false, configurable: true });
            Object.defineProperty(prototype, Symbol.toStringTag, { value: name, configurable: true });
            if (parent) Object.setPrototypeOf(result, parent);
            if (global) {
                const inherited = Function.prototype[Symbol.hasInstance];
                Object.defineProperty(result, Symbol.hasInstance,
                    fixed(function(value) { return value === global || inherited.call(this, value); }));
            }
            return result;
        },
        // Sixteen objects that inherit from `prototype`, handed over in one call.
        blanksOf(prototype, take) {
            function Blank() {}
            Blank.prototype = prototype;
            return () => take(new Blank, new Blank, new Blank, new Blank, new Blank, new Blank, new Blank, new Blank,
                              new Blank, new Blank, new Blank, new Blank, new Blank, new Blank, new Blank, new Blank);
        },
        tag(target, name) {
            Object.defineProperty(target, Symbol.toStringTag, { value: name, configurable: true });
        }
    };
})())";

JSValueRef InvalidConstructor(JSContextRef context, JSObjectRef, JSObjectRef, size_t, const JSValueRef[],
                              JSValueRef* exception) {
    RaiseError(context, "Invalid constructor!", exception);
    return JSObjectMake(context, nullptr, nullptr);
}

class Installer {
  public:
    explicit Installer(ScriptingContext& page)
        : page_(page), context_(page.context), global_(JSContextGetGlobalObject(page.context)) {
        JSStringRef source = JSStringCreateWithUTF8CString(kBuilders.data());
        const JSValueRef builders = JSEvaluateScript(context_, source, nullptr, nullptr, 0, nullptr);
        JSStringRelease(source);
        auto* object = const_cast<JSObjectRef>(builders);
        accessor_ = Function(object, "accessor");
        constant_ = Function(object, "constant");
        constructor_of_ = Function(object, "constructorOf");
        tag_ = Function(object, "tag");
        blanks_of_ = Function(object, "blanksOf");
        invalid_constructor_ = JSObjectMakeFunctionWithCallback(context_, nullptr, InvalidConstructor);
    }

    void Run() {
        page_.prototype_keeper = JSObjectMakeArray(context_, 0, nullptr, nullptr);
        JSValueProtect(context_, page_.prototype_keeper);
        for (size_t i = 0; i < kScriptClassCount; ++i) {
            page_.prototypes[i] = JSObjectMake(context_, nullptr, nullptr);
            JSObjectSetPropertyAtIndex(context_, page_.prototype_keeper, static_cast<unsigned>(i),
                                       page_.prototypes[i], nullptr);
        }
        JSObjectSetPropertyAtIndex(context_, page_.prototype_keeper,
                                   static_cast<unsigned>(2 * kScriptClassCount), blanks_of_, nullptr);
        page_.blanks_of = blanks_of_;
        // Constructors need a second pass with parents first; the keeper holds them behind the prototypes,
        // and the array on this stack keeps them for the while.
        for (size_t i = 0; i < kScriptClassCount; ++i)
            InstallMembers(static_cast<ScriptClass>(i));
        for (size_t i = 0; i < kScriptClassCount; ++i)
            ConstructorFor(static_cast<ScriptClass>(i));
        Call(tag_, {global_, ToScriptString(context_, "Window")});
    }

  private:
    JSObjectRef Function(JSObjectRef object, const char* name) {
        return const_cast<JSObjectRef>(GetProperty(context_, object, name));
    }

    JSValueRef Call(JSObjectRef function, std::initializer_list<JSValueRef> arguments) {
        return CallFunction(context_, function, nullptr, {arguments.begin(), arguments.size()});
    }

    JSObjectRef MakeFunction(const char* name, JSObjectCallAsFunctionCallback callback) {
        JSStringRef text = JSStringCreateWithUTF8CString(name);
        const JSObjectRef function = JSObjectMakeFunctionWithCallback(context_, text, callback);
        JSStringRelease(text);
        return function;
    }

    void DefineMembers(JSObjectRef target, const ClassDescription& description) {
        for (const AttributeDescription& attribute : description.attributes) {
            const JSValueRef undefined = JSValueMakeUndefined(context_);
            const JSValueRef getter = MakeFunction(attribute.name, attribute.getter);
            const JSValueRef setter =
                attribute.setter ? MakeFunction(attribute.name, attribute.setter) : undefined;
            Call(accessor_, {target, ToScriptString(context_, attribute.name), getter, setter});
        }
        for (const MethodDescription& method : description.methods) {
            SetProperty(context_, target, method.name, MakeFunction(method.name, method.callback),
                        kJSPropertyAttributeNone);
        }
        DefineConstants(target, description);
    }

    void DefineConstants(JSObjectRef target, const ClassDescription& description) {
        for (const ConstantDescription& constant : description.constants) {
            Call(constant_, {target, ToScriptString(context_, constant.name),
                             JSValueMakeNumber(context_, constant.value)});
        }
    }

    void InstallMembers(ScriptClass script_class) {
        const JSObjectRef prototype = page_.prototypes[static_cast<size_t>(script_class)];
        const ScriptClass parent = GetScriptClassRow(script_class).parent;
        if (parent != ScriptClass::None) {
            JSObjectSetPrototype(context_, prototype, page_.prototypes[static_cast<size_t>(parent)]);
        }
        const ClassDescription* description = GetClassDescription(script_class);
        if (!description) return;
        // The global object's prototype cannot be changed: what its classes have stands on itself.
        if (IsScriptClassOrDerived(ScriptClass::Window, script_class)) DefineMembers(global_, *description);
        if (script_class != ScriptClass::Window) DefineMembers(prototype, *description);
    }

    JSObjectRef ConstructorFor(ScriptClass script_class) {
        JSObjectRef& made = constructors_[static_cast<size_t>(script_class)];
        if (made || script_class == ScriptClass::None) return made;
        const ScriptClassRow& row = GetScriptClassRow(script_class);
        const JSObjectRef parent = ConstructorFor(row.parent);
        const ClassDescription* description = GetClassDescription(script_class);
        const JSValueRef construct = description && description->construct
                                         ? MakeFunction(row.name, description->construct)
                                         : invalid_constructor_;
        const JSValueRef null = JSValueMakeNull(context_);
        const bool answers_for_global = IsScriptClassOrDerived(ScriptClass::Window, script_class);
        made = const_cast<JSObjectRef>(
            Call(constructor_of_,
                 {ToScriptString(context_, row.name), page_.prototypes[static_cast<size_t>(script_class)],
                  parent ? parent : null, construct, answers_for_global ? JSValueRef{global_} : null}));
        if (!made) return nullptr;
        if (description) DefineConstants(made, *description);
        if (description && !description->has_global_name) return made;
        SetProperty(context_, global_, row.name, made, kJSPropertyAttributeDontEnum);
        if (description && description->alias) {
            SetProperty(context_, global_, description->alias, made, kJSPropertyAttributeDontEnum);
        }
        return made;
    }

    ScriptingContext& page_;
    JSGlobalContextRef context_;
    JSObjectRef global_;
    JSObjectRef accessor_ = nullptr;
    JSObjectRef constant_ = nullptr;
    JSObjectRef constructor_of_ = nullptr;
    JSObjectRef tag_ = nullptr;
    JSObjectRef blanks_of_ = nullptr;
    JSObjectRef invalid_constructor_ = nullptr;
    // Index kScriptClassCount stands for "no class" and stays null.
    std::array<JSObjectRef, kScriptClassCount + 1> constructors_{};
};

}  // namespace

void InstallClasses(ScriptingContext& page) {
    // On the stack, where the collector sees the objects it holds.
    Installer(page).Run();
}

void UninstallClasses(ScriptingContext& page) {
    if (page.prototype_keeper) UnprotectUnlessTeardown(page.context, page.prototype_keeper);
    page.prototype_keeper = nullptr;
    page.prototypes = {};
    page.blanks_of = nullptr;
}

}  // namespace qorvex::script
