// The road of a sheet's text: ParseCSS on the resource channel, then the sheet on the main channel.
#pragma once

#include "core/memory/string_pool.h"
#include "core/tasks/task_system.h"
#include "css/parser/convert.h"
#include "resources/resource_request_job.h"

namespace qorvex {

// `name` is that of the task in which `deliver` runs, on the main thread; a literal.
template <class Deliver>
void PushSheet(TaskFamilyHandle family, const char* name, RefPtr<css::Stylesheet> sheet, Deliver deliver) {
    family.Push(TaskChannels::Main,
                MakeTask(name, [sheet = std::move(sheet), deliver](TaskFamilyHandle) { deliver(sheet); }));
}

// Parses the job's bytes against the URL that they came from. The pool outlives the family.
template <class Deliver>
void PushParseCSS(TaskFamilyHandle family, StringPool& strings, ResourceJobPtr job, const char* name,
                  Deliver deliver) {
    family.Push(TaskChannels::Resources, MakeTask("ParseCSS", [&strings, job = std::move(job), name,
                                                               deliver](TaskFamilyHandle handle) {
                    const auto bytes = job->GetData();
                    const std::string_view text(reinterpret_cast<const char*>(bytes.data()), bytes.size());
                    PushSheet(handle, name,
                              css::MakeStylesheet(text, job->GetResponseURL().GetText(), strings), deliver);
                }));
}

// Parses a copy of `text`, as an inline style element holds it.
template <class Deliver>
void PushParseCSS(TaskFamilyHandle family, StringPool& strings, std::string_view text, const URL& base,
                  const char* name, Deliver deliver) {
    using Text = TaggedString<MemoryTag::CSS>;
    family.Push(TaskChannels::Resources, MakeTask("ParseCSS", [&strings, copy = Text(text), base, name,
                                                               deliver](TaskFamilyHandle handle) {
                    PushSheet(handle, name, css::MakeStylesheet(copy, base.GetText(), strings), deliver);
                }));
}

}  // namespace qorvex
