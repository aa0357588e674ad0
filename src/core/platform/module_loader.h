// Optional modules that are loaded by name at run time: media decoders, the inspector's transport. The system
// runs on without them.
#pragma once

#include <string_view>
#include <utility>

namespace qorvex {

/// A loaded module, or none. Moves only; the module goes with it.
class Module {
  public:
    Module() = default;
    explicit Module(void* handle) : handle_(handle) {}
    Module(Module&& other) noexcept : handle_(std::exchange(other.handle_, nullptr)) {}
    Module& operator=(Module&& other) noexcept;
    ~Module();

    explicit operator bool() const { return handle_ != nullptr; }
    /// The exported function, null when the module does not have it.
    template <class FunctionPointer>
    [[nodiscard]] FunctionPointer Get(const char* name) const {
        return reinterpret_cast<FunctionPointer>(Find(name));
    }

  private:
    void* Find(const char* name) const;
    void* handle_ = nullptr;
};

/// The module of this name, without directory or ending; an empty one when it is not there.
[[nodiscard]] Module LoadModule(std::string_view name);

}  // namespace qorvex
