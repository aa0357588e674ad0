// The engine's allocator and log handler in the shapes that the rendering library takes. Stateless but for
// the objects they forward to, which must outlive them; any thread.
#pragma once

#include <fresco/allocator.h>
#include <fresco/logging.h>
#include <qorvex/allocator.h>
#include <qorvex/logging.h>

namespace qorvex {

class FrescoAllocator final : public fresco::IAllocator {
  public:
    explicit FrescoAllocator(qorvex::IAllocator& allocator) : allocator_(allocator) {}
    void* Allocate(size_t size, size_t alignment) override;
    void Deallocate(void* block, size_t alignment) override;

  private:
    qorvex::IAllocator& allocator_;
};

class FrescoLogHandler final : public fresco::Logging::ILogHandler {
  public:
    // Null: the engine's own logger, with its handler and its threshold.
    explicit FrescoLogHandler(Logging::ILogHandler* handler) : handler_(handler) {}
    void WriteLog(fresco::Logging::Severity severity, const char* text, size_t length) override;

  private:
    Logging::ILogHandler* handler_;
};

}  // namespace qorvex
