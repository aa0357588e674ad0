#include "script/class_table.h"

namespace qorvex::script {

namespace {

constexpr std::array<ScriptClassRow, kScriptClassCount> kRows = {{
#define X(name, parent, finaliser) {#name, ScriptClass::parent, Finaliser::finaliser},
    QORVEX_SCRIPT_CLASSES(X)
#undef X
}};

}  // namespace

const ScriptClassRow& GetScriptClassRow(ScriptClass script_class) {
    return kRows[static_cast<size_t>(script_class)];
}

ScriptClassTable& GetScriptClassTable() {
    static constinit ScriptClassTable table;
    return table;
}

}  // namespace qorvex::script
