#pragma once

#include <qorvex/input_events.h>

#include <cstdint>
#include <string>
#include <variant>
#include <vector>

namespace qorvex {
class View;
}

namespace player {

// Input records from a JSON array, each with the number of the frame before which it is fed. README.md tells
// the format.
class EventFile {
  public:
    // False with one line when the file cannot be read or a record is wrong; the line names the record.
    [[nodiscard]] bool Load(const std::string& file, std::string& error);

    // Feeds the records of this frame, in the order of the file.
    void Feed(std::uint32_t frame, qorvex::View& view);

    // True while records of later frames wait.
    [[nodiscard]] bool Remaining() const { return fed_ < records_.size(); }

  private:
    using Input = std::variant<qorvex::MouseEventData, qorvex::KeyEventData, qorvex::TouchEventData>;
    struct Record {
        std::uint32_t frame = 0;
        std::vector<Input> inputs;
    };

    struct Reader;

    std::vector<Record> records_;
    std::size_t fed_ = 0;
};

}  // namespace player
