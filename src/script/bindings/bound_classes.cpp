#include "script/bindings/bound_classes.h"

namespace qorvex::script {

void CreateScriptClasses() {
    static constexpr const ClassDescription* kDescriptions[] = {
#define X(name) &name,
        QORVEX_CLASS_DESCRIPTIONS(X)
#undef X
    };
    CreateScriptClasses(kDescriptions);
}

}  // namespace qorvex::script
