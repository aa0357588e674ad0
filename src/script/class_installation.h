// What a context gets of the bound classes: prototypes with the members of their descriptions, constructors
// and the window's members on the global object.
//
// Prototypes are plain objects with accessors and functions. Constructors are script functions around a
// native one, so that `typeof`, `.call`, subclassing and new.target work as on the web.
//
// A class is made when a page first names it or meets an object of it: all 95 would cost 4 ms before the
// first frame, and a page uses about a dozen. What can be made through the C API is, without a script that
// would have to be parsed and run cold for each page. Until then the global name is an accessor, which puts
// the constructor in its own place; `constructor` of a prototype is one as well, as most pages use objects of
// a class and never name it.
//
// The global object is a plain one and not of class Window: on a global of a native class every name that is
// not the page's own variable costs a search through that class (`Math` 66 ns against 0.3, `document` 42
// against 0.3). The window's members therefore are own properties of the global object, as Web IDL wants them
// for a [Global] interface, and `window instanceof Window` is answered by Symbol.hasInstance.
#pragma once

#include <JavaScriptCore/JSBase.h>

#include "script/scripting_context.h"

namespace qorvex::script {

// The names of all classes and the members of the global object. The context is registered and the table of
// classes filled.
void InstallClasses(ScriptingContext& page);

// The prototype of a class, made on first use. Null without installed classes, or when script cannot run now:
// out of stack, being stopped.
[[nodiscard]] JSObjectRef GetPrototype(ScriptingContext& page, ScriptClass script_class);

// From this index on the page's class_keeper is free for others: an entry a class.
inline constexpr size_t kClassKeeperUses = 2 * kScriptClassCount + kClassToolCount;

// A function that gives sixteen objects which inherit from the prototype to `take`, in one call. Null when
// script cannot run now.
[[nodiscard]] JSObjectRef MakeBlankMaker(ScriptingContext& page, JSObjectRef prototype, JSObjectRef take);

// Lets go of what InstallClasses keeps. Before the context is released.
void UninstallClasses(ScriptingContext& page);

}  // namespace qorvex::script
