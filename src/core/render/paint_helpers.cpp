#include "core/render/paint_helpers.h"

namespace qorvex {

namespace {

// Work that goes back even when its task is dropped.
class HeldWork {
  public:
    explicit HeldWork(fresco::IPaintWork* work) : work_(work) {}
    HeldWork(HeldWork&& other) noexcept : work_(std::exchange(other.work_, nullptr)) {}
    HeldWork& operator=(HeldWork&&) = delete;
    ~HeldWork() {
        if (work_) work_->Release();
    }
    void Run() { work_->Run(); }

  private:
    fresco::IPaintWork* work_;
};

}  // namespace

PaintHelpers::PaintHelpers(TaskSystem& tasks, uint32_t family, uint32_t count)
    : family_{family, &tasks}, count_(count) {
    tasks.OpenChannel(TaskChannels::Resources, family);
}

uint32_t PaintHelpers::GetCount() {
    const bool idle =
        family_.system->IsRunning() && family_.system->GetPendingTasks(TaskChannels::Resources) == 0;
    return idle ? count_ : 0;
}

void PaintHelpers::Post(fresco::IPaintWork* work) {
    family_.Push(TaskChannels::Resources,
                 MakeTask("PaintBands", [held = HeldWork(work)](TaskFamilyHandle) mutable { held.Run(); }));
}

}  // namespace qorvex
