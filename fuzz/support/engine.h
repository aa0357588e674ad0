// What the engine's code needs around it in a fuzz target: an allocator that checks every release, a log that
// throws lines away, temporary memory. One for the process; object pools are off, so that the sanitizers see
// every object by itself.
#pragma once

#include <cstddef>
#include <string_view>
#include <vector>

namespace qorvex::fuzz {

/// Stands for one input. Everything that was allocated in its life has to be gone at its end, under the tag
/// it came with; else the process ends with a report. An "Assert failure" is a finding too, but for those
/// that bad input may cause: they are named by their beginnings.
class Input {
  public:
    explicit Input(std::vector<std::string_view> expected_assertions = {});
    ~Input();
    Input(const Input&) = delete;
    Input& operator=(const Input&) = delete;

  private:
    size_t blocks_before_;
};

/// Ends the process with the text when the condition does not hold.
void Require(bool condition, const char* what);
/// The same, with the texts that should have been one.
void RequireSame(std::string_view one, std::string_view other, const char* what);

}  // namespace qorvex::fuzz
