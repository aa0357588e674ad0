#include "script/class_table.h"

namespace qorvex::script {

ScriptClassTable& GetScriptClassTable() {
    static constinit ScriptClassTable table;
    return table;
}

}  // namespace qorvex::script
