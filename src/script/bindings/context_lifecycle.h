// How a page's script context comes and goes.
#pragma once

#include "core/limits.h"
#include "core/memory/containers.h"
#include "script/scripting_context.h"

namespace qorvex::dom {
class Document;
class IWindowHost;
}  // namespace qorvex::dom

namespace qorvex::script {

using ScriptingContextPtr = UniquePtr<ScriptingContext, MemoryTag::General>;

// A context of its own for one document: group, global object, window, constructors. The document then leads
// to it. `host` and `document` outlive it. A script that runs for more than `time_limit` seconds is stopped.
[[nodiscard]] ScriptingContextPtr CreateScriptingContext(dom::IWindowHost& host, dom::Document& document,
                                                         double time_limit = limits::kScriptTimeLimitSeconds);

// What the engine itself changes in the language of a page, before the client's own scripts.
void RunPreludeScripts(ScriptingContext& context);

// Ends the context: nothing native refers to its heap afterwards, and every wrapper is finalised. Objects
// that native code holds live on without a wrapper. Not to be called while script of this context runs.
void DestroyScriptingContext(ScriptingContextPtr context);

}  // namespace qorvex::script
