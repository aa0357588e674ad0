#include "script/class_description.h"

#include <array>

#include "core/logging/log.h"

namespace qorvex::script {

namespace {

std::array<const ClassDescription*, kScriptClassCount> g_descriptions{};

JSClassRef CreateClass(ScriptClass script_class, const ClassDescription* description) {
    const ScriptClassRow& row = GetScriptClassRow(script_class);
    JSClassDefinition definition = kJSClassDefinitionEmpty;
    definition.className = row.name;
    // Neither a parent class nor the automatic prototype: the engine searches the tables of every class of a
    // chain on every access (463 ns for a method of the fifth class, 167 with plain prototype objects).
    definition.attributes = kJSClassAttributeNoAutomaticPrototype;
    if (description) {
        definition.hasProperty = description->properties.has;
        definition.getProperty = description->properties.get;
        definition.setProperty = description->properties.set;
        definition.deleteProperty = description->properties.remove;
        definition.getPropertyNames = description->properties.names;
        definition.finalize = description->finalise;
    }
    return JSClassCreate(&definition);
}

}  // namespace

void CreateScriptClasses(std::span<const ClassDescription* const> descriptions) {
    LogTrace("Initializing scripting...");
    g_descriptions = {};
    for (const ClassDescription* description : descriptions) {
        g_descriptions[static_cast<size_t>(description->script_class)] = description;
    }
    ScriptClassTable& table = GetScriptClassTable();
    for (size_t i = 0; i < kScriptClassCount; ++i) {
        const auto script_class = static_cast<ScriptClass>(i);
        // The others are plain objects (wrapper_table.h) and never ask for theirs.
        if (!HasPropertyRules(script_class) || table[script_class]) continue;
        table.Set(script_class, CreateClass(script_class, g_descriptions[i]));
    }
}

void ReleaseScriptClasses() {
    LogTrace("Uninitializing scripting...");
    ScriptClassTable& table = GetScriptClassTable();
    for (size_t i = 0; i < kScriptClassCount; ++i) {
        const auto script_class = static_cast<ScriptClass>(i);
        if (table[script_class]) JSClassRelease(table[script_class]);
        table.Set(script_class, nullptr);
    }
    g_descriptions = {};
}

const ClassDescription* GetClassDescription(ScriptClass script_class) {
    return g_descriptions[static_cast<size_t>(script_class)];
}

}  // namespace qorvex::script
