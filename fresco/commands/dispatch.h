// Runs a stream through a visitor: one virtual call a record. The stream is trusted: it comes from a recorder
// of this process or has passed ValidateStream.
#pragma once
#include "fresco/commands/tails.h"

namespace fresco {

class CommandVisitor {
  public:
#define FRESCO_VISIT(name, tail, fields) \
    virtual void name(const name##Record& record, const tail##Tail& data) = 0;
#define FRESCO_FIELD(type, field)
    FRESCO_COMMANDS(FRESCO_VISIT, FRESCO_FIELD)
#undef FRESCO_VISIT
#undef FRESCO_FIELD

  protected:
    ~CommandVisitor() = default;
};

// For the body of a visitor's class: declares all overrides.
#define FRESCO_DECLARE_VISIT(name, tail, fields) \
    void name(const name##Record& record, const tail##Tail& data) override;
#define FRESCO_NO_FIELD(type, field)
#define FRESCO_OVERRIDE_COMMANDS FRESCO_COMMANDS(FRESCO_DECLARE_VISIT, FRESCO_NO_FIELD)

template <class Visitor>
void DispatchStream(const void* stream, size_t size, Visitor& visitor) {
    const auto* cursor = static_cast<const uint8_t*>(stream);
    const uint8_t* end = cursor + size;
    while (size_t(end - cursor) >= sizeof(RecordHeader)) {
        const auto& header = *reinterpret_cast<const RecordHeader*>(cursor);
        const uint8_t* body = cursor + sizeof(RecordHeader);
        switch (CommandType(header.type)) {
#define FRESCO_CASE(name, tail, fields)                                                                      \
    case CommandType::name: {                                                                                \
        const auto& record = *reinterpret_cast<const name##Record*>(body);                                   \
        const uint32_t tailSize = uint32_t(header.size - sizeof(RecordHeader) - sizeof(name##Record));       \
        visitor.name(record, ReadTail(record, body + sizeof(name##Record), tailSize, (tail##Tail*)nullptr)); \
        break;                                                                                               \
    }
            FRESCO_COMMANDS(FRESCO_CASE, FRESCO_NO_FIELD)
#undef FRESCO_CASE
            default:
                return;
        }
        cursor += header.size;
    }
}

}  // namespace fresco
