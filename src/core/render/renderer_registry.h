// The renderers that the client has not destroyed yet, so that the end of the library can take what was
// forgotten with it: a renderer holds its view's scene, which must not outlive the rendering library.
// Any thread.
#pragma once

#include "core/memory/containers.h"
#include "qsl/mutex.h"

namespace qorvex {

class SystemRenderer;
class ViewRenderer;

class RendererRegistry {
  public:
    void Add(ViewRenderer* renderer) QSL_EXCLUDES(mutex_);
    void Add(SystemRenderer* renderer) QSL_EXCLUDES(mutex_);
    void Remove(ViewRenderer* renderer) QSL_EXCLUDES(mutex_);
    void Remove(SystemRenderer* renderer) QSL_EXCLUDES(mutex_);
    // With an Error line when there are any. No other thread may use a renderer any more.
    void DestroyForgotten() QSL_EXCLUDES(mutex_);

  private:
    qsl::Mutex mutex_;
    Vector<ViewRenderer*> views_ QSL_GUARDED_BY(mutex_);
    Vector<SystemRenderer*> systems_ QSL_GUARDED_BY(mutex_);
};

}  // namespace qorvex
