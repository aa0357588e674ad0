#include "event_file.h"

#include <qorvex/view.h>
#include <rapidjson/document.h>

#include <algorithm>
#include <fstream>
#include <iterator>

namespace player {
using namespace qorvex;

// Reads one record; the first thing that is wrong ends up in `why`.
struct EventFile::Reader {
    const rapidjson::Value& json;
    std::string why;

    double Number(const char* name, double absent) {
        const auto member = json.FindMember(name);
        if (member == json.MemberEnd()) return absent;
        if (!member->value.IsNumber()) {
            why = std::string("\"") + name + "\" is no number";
            return absent;
        }
        return member->value.GetDouble();
    }

    std::int32_t Integer(const char* name) {
        return static_cast<std::int32_t>(std::clamp(Number(name, 0), -1e6, 1e6));
    }

    std::string Text(const char* name) {
        const auto member = json.FindMember(name);
        if (member == json.MemberEnd() || !member->value.IsString()) return {};
        return {member->value.GetString(), member->value.GetStringLength()};
    }

    // The position of a word in a list of allowed ones.
    std::size_t Word(const char* name, std::initializer_list<const char*> allowed) {
        const std::string word = Text(name);
        std::size_t index = 0;
        for (const char* candidate : allowed) {
            if (word == candidate) return index;
            ++index;
        }
        why = std::string("\"") + name + "\" is \"" + word + "\"";
        return 0;
    }

    void Mouse(std::vector<Input>& out) {
        static constexpr MouseEventData::EventType kTypes[] = {MouseEventData::Down, MouseEventData::Up,
                                                               MouseEventData::Move};
        MouseEventData data;
        data.Type = kTypes[Word("event", {"down", "up", "move"})];
        data.Button = Integer("button");
        data.X = Integer("x");
        data.Y = Integer("y");
        const bool down = data.Type == MouseEventData::Down;
        data.LeftDown = down && data.Button == 0;
        data.MiddleDown = down && data.Button == 1;
        data.RightDown = down && data.Button == 2;
        out.emplace_back(data);
    }

    void Wheel(std::vector<Input>& out) {
        MouseEventData data;
        data.Type = MouseEventData::Wheel;
        data.X = Integer("x");
        data.Y = Integer("y");
        data.WheelX = static_cast<float>(Number("dx", 0));
        data.WheelY = static_cast<float>(Number("dy", 0));
        out.emplace_back(data);
    }

    // A "char" record is one event for each code point of its text.
    void Key(std::vector<Input>& out) {
        static constexpr KeyEventData::EventType kTypes[] = {KeyEventData::Down, KeyEventData::Up,
                                                             KeyEventData::Char};
        KeyEventData data;
        data.Type = kTypes[Word("event", {"down", "up", "char"})];
        data.KeyCode = Integer("key");
        const std::string text = Text("text");
        if (data.Type != KeyEventData::Char || text.empty()) {
            out.emplace_back(data);
            return;
        }
        for (std::size_t i = 0; i < text.size();) {
            const auto lead = static_cast<unsigned char>(text[i]);
            const std::size_t size = lead < 0x80 ? 1 : lead < 0xE0 ? 2 : lead < 0xF0 ? 3 : 4;
            std::int32_t code = size == 1 ? lead : lead & (0x7F >> size);
            for (std::size_t k = 1; k < size && i + k < text.size(); ++k)
                code = code << 6 | (text[i + k] & 0x3F);
            data.KeyCode = code;
            out.emplace_back(data);
            i += size;
        }
    }

    void Touch(std::vector<Input>& out) {
        static constexpr TouchEventData::EventType kTypes[] = {TouchEventData::Down, TouchEventData::Up,
                                                               TouchEventData::Move};
        TouchEventData data;
        data.Type = kTypes[Word("event", {"down", "up", "move"})];
        data.Id = static_cast<std::uint32_t>(Integer("id"));
        data.X = Integer("x");
        data.Y = Integer("y");
        out.emplace_back(data);
    }

    Record Read() {
        Record record;
        record.frame = static_cast<std::uint32_t>(std::max(0, Integer("frame")));
        switch (Word("type", {"mouse", "wheel", "key", "touch", "gamepad"})) {
            case 0:
                Mouse(record.inputs);
                break;
            case 1:
                Wheel(record.inputs);
                break;
            case 2:
                Key(record.inputs);
                break;
            case 3:
                Touch(record.inputs);
                break;
            default:
                break;  // gamepads get their record with the input routing
        }
        return record;
    }
};

bool EventFile::Load(const std::string& file, std::string& error) {
    std::ifstream stream(file, std::ios::binary);
    const std::string text(std::istreambuf_iterator<char>(stream), {});
    if (!stream.good() && !stream.eof()) {
        error = "cannot read " + file;
        return false;
    }
    rapidjson::Document document;
    document.Parse<rapidjson::kParseIterativeFlag>(text.data(), text.size());
    if (document.HasParseError() || !document.IsArray()) {
        error = file + " is no JSON array";
        return false;
    }
    for (const rapidjson::Value& value : document.GetArray()) {
        std::string why = "no object";
        if (value.IsObject()) {
            Reader reader{value, {}};
            records_.push_back(reader.Read());
            why = reader.why;
        }
        if (!why.empty()) {
            error = file + ": record " + std::to_string(records_.size()) + ": " + why;
            return false;
        }
    }
    std::stable_sort(records_.begin(), records_.end(),
                     [](const Record& a, const Record& b) { return a.frame < b.frame; });
    return true;
}

void EventFile::Feed(std::uint32_t frame, View& view) {
    for (; fed_ < records_.size() && records_[fed_].frame <= frame; ++fed_) {
        for (const Input& input : records_[fed_].inputs) {
            if (const auto* mouse = std::get_if<MouseEventData>(&input)) {
                view.MouseEvent(*mouse, nullptr, nullptr);
            } else if (const auto* key = std::get_if<KeyEventData>(&input)) {
                view.KeyEvent(*key, nullptr, nullptr);
            } else {
                view.TouchEvent(&std::get<TouchEventData>(input), 1, nullptr, nullptr);
            }
        }
    }
}

}  // namespace player
