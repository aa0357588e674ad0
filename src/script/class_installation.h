// What a context gets of the bound classes: prototypes with the members of their descriptions, constructors
// and the window's members on the global object.
//
// Prototypes are plain objects with accessors and functions, made for each context; wrappers take theirs from
// ScriptingContext::prototypes. Constructors are script functions around a native one, so that `typeof`,
// `.call`, subclassing and new.target work as on the web.
//
// The global object is a plain one and not of class Window: on a global of a native class every name that is
// not the page's own variable costs a search through that class (`Math` 66 ns against 0.3, `document` 42
// against 0.3). The window's members therefore are own properties of the global object, as Web IDL wants them
// for a [Global] interface, and `window instanceof Window` is answered by Symbol.hasInstance.
#pragma once

#include <JavaScriptCore/JSBase.h>

#include "script/scripting_context.h"

namespace qorvex::script {

// Fills `prototypes` and installs all constructors. The context is registered and its table of classes
// filled.
void InstallClasses(ScriptingContext& page);

// Lets go of what InstallClasses keeps. Before the context is released.
void UninstallClasses(ScriptingContext& page);

}  // namespace qorvex::script
