#include "layout/dom_tasks.h"

#include "core/tasks/task.h"
#include "core/tasks/task_system.h"

namespace qorvex::layout {

const char* DOMTaskName(DOMTaskKind kind) {
    switch (kind) {
        case DOMTaskKind::UpdateTextRunsInDOM:
            return "UpdateTextRunsInDOM";
        case DOMTaskKind::UpdateTextPositionsInDOM:
            return "UpdateTextPositionsInDOM";
        case DOMTaskKind::UpdateFontStyleDataInDOM:
            return "UpdateFontStyleDataInDOM";
        case DOMTaskKind::UpdateTextAlignmentInDOM:
            return "UpdateTextAlignmentInDOM";
        case DOMTaskKind::UpdateScrollPositionInDOM:
            return "UpdateScrollPositionInDOM";
        case DOMTaskKind::UpdateDirtyHighlightRect:
            return "UpdateDirtyHighlightRect";
        case DOMTaskKind::FontArrived:
            return "FontArrived";
    }
    return "";
}

void SendToDOM(const TaskFamilyHandle& family, DOMTaskKind kind, NodeLinkPtr node, DOMTaskDataPtr data,
               Delivery delivery) {
    if (!node || !data) return;
    if (delivery == Delivery::AtOnce) {
        node->Receive(kind, *data);
        return;
    }
    family.Push(TaskChannels::Main,
                MakeTask(DOMTaskName(kind), [kind, node = std::move(node), data = std::move(data)](
                                                TaskFamilyHandle) { node->Receive(kind, *data); }));
}

}  // namespace qorvex::layout
