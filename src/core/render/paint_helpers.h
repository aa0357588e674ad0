// Lends the client's resource threads to the rendering library: a part of a frame is a task on the resource
// channel, under the library's own family.
#pragma once

#include <fresco/paint_helpers.h>

#include "core/tasks/task_system.h"

namespace qorvex {

class PaintHelpers final : public fresco::IPaintHelpers {
  public:
    PaintHelpers(TaskSystem& tasks, uint32_t family, uint32_t count);

    /// 0 while the channel has work: its threads are busy, or nobody serves it.
    uint32_t GetCount() override;
    void Post(fresco::IPaintWork* work) override;

  private:
    TaskFamilyHandle family_;
    const uint32_t count_;
};

}  // namespace qorvex
