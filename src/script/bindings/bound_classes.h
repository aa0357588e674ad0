// The declarations of the bound classes. Each is defined in the file of its family; the list that the library
// start goes through is made from these rows.
#pragma once

#include "script/class_description.h"

namespace qorvex::script {

// X(name of a ClassDescription)
#define QORVEX_CLASS_DESCRIPTIONS(X) \
    X(kAttrClass)                    \
    X(kCharacterDataClass)           \
    X(kCommentClass)                 \
    X(kConsoleClass)                 \
    X(kCSSStyleDeclarationClass)     \
    X(kCustomEventClass)             \
    X(kDocumentClass)                \
    X(kDocumentFragmentClass)        \
    X(kDOMRectClass)                 \
    X(kDOMRectReadOnlyClass)         \
    X(kDOMStringMapClass)            \
    X(kDOMTokenListClass)            \
    X(kElementClass)                 \
    X(kEventClass)                   \
    X(kEventListenerClass)           \
    X(kEventTargetClass)             \
    X(kHTMLCollectionClass)          \
    X(kHTMLElementClass)             \
    X(kHTMLImageElementClass)        \
    X(kHTMLLinkElementClass)         \
    X(kHTMLScriptElementClass)       \
    X(kNamedNodeMapClass)            \
    X(kNodeClass)                    \
    X(kNodeListClass)                \
    X(kPerformanceClass)             \
    X(kTextClass)                    \
    X(kUIEventClass)                 \
    X(kWindowClass)

#define X(name) extern const ClassDescription name;
QORVEX_CLASS_DESCRIPTIONS(X)
#undef X

// Library start and end: the process-wide table with all of them.
void CreateScriptClasses();

}  // namespace qorvex::script
