// A bound class as data. One constant of type ClassDescription for each class says all that script can see of
// it; member_callbacks.h makes the C functions from the native operations that it names, class_installation.h
// turns it into prototypes and constructors of a context. Name, parent and finaliser kind stand in the class
// table.
#pragma once

#include <JavaScriptCore/JavaScript.h>

#include <cstdint>
#include <span>

#include "script/class_table.h"

namespace qorvex::script {

// Accessors are functions as well: the engine calls them with the object as `this`.
struct AttributeDescription {
    const char* name;
    JSObjectCallAsFunctionCallback getter;
    JSObjectCallAsFunctionCallback setter = nullptr;  // null: read-only
};

struct MethodDescription {
    const char* name;
    JSObjectCallAsFunctionCallback callback;
};

// On the prototype and on the constructor, read-only.
struct ConstantDescription {
    const char* name;
    double value;
};

// Access by index or by name, for collections and maps.
struct PropertyAccessDescription {
    JSObjectHasPropertyCallback has = nullptr;
    JSObjectGetPropertyCallback get = nullptr;
    JSObjectSetPropertyCallback set = nullptr;
    JSObjectDeletePropertyCallback remove = nullptr;
    JSObjectGetPropertyNamesCallback names = nullptr;
    // A list with a length: script walks it as it walks an array.
    bool indexed = false;
};

struct ClassDescription {
    ScriptClass script_class;
    std::span<const AttributeDescription> attributes = {};
    // The one list that several classes have alike: a page makes their functions once.
    std::span<const AttributeDescription> shared_attributes = {};
    std::span<const MethodDescription> methods = {};
    std::span<const ConstantDescription> constants = {};
    // Called with new.target, then the arguments of `new`; returns the object. Null: "Invalid constructor!".
    JSObjectCallAsFunctionCallback construct = nullptr;
    // A second global name of the same constructor.
    const char* alias = nullptr;
    // False for classes that script cannot name.
    bool has_global_name = true;
    PropertyAccessDescription properties = {};
    // For the one class whose private is not a handle.
    JSObjectFinalizeCallback finalise = nullptr;
};

// Takes the descriptions, which must live until ReleaseScriptClasses, and fills the process-wide table with
// the classes that have property rules. Logs "Initializing scripting...".
void CreateScriptClasses(std::span<const ClassDescription* const> descriptions);
// Logs "Uninitializing scripting...".
void ReleaseScriptClasses();

// The description of a class; null for one that has none.
[[nodiscard]] const ClassDescription* GetClassDescription(ScriptClass script_class);

}  // namespace qorvex::script
