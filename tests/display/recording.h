// Frames recorded by pages without pixels: the records of a command stream as text, one a line.
#pragma once

#include "display/record_rendering.h"
#include "display/transforms.h"
#include "layout/page_fixture.h"

#include <fresco/command_records.h>

namespace qorvex::test {

inline std::string Numbers(std::initializer_list<float> values) {
    std::string text;
    for (const float value : values) {
        char part[32];
        // Neither -0 nor the noise of a sine.
        std::snprintf(part, sizeof(part), " %g", std::fabs(value) < 1e-5f ? 0.0f : value);
        text += part;
    }
    return text;
}
inline std::string Text(const fresco::Rect& r) {
    return Numbers({r.x, r.y, r.width, r.height});
}
inline std::string Text(const fresco::Paint& p) {
    char part[32];
    auto byte = [](float channel) { return static_cast<int>(std::lround(channel * 255)); };
    std::snprintf(part, sizeof(part), " #%02x%02x%02x%02x", byte(p.color.r), byte(p.color.g), byte(p.color.b),
                  byte(p.color.a));
    return part;
}
inline std::string Text(const fresco::LayerPaint& p) {
    return Text(static_cast<const fresco::Paint&>(p));
}
inline std::string Text(const fresco::CornerRadii& r) {
    return " r" + Numbers({r.topLeft.x, r.topLeft.y, r.topRight.x, r.topRight.y, r.bottomRight.x,
                           r.bottomRight.y, r.bottomLeft.x, r.bottomLeft.y});
}
inline std::string Text(const fresco::Circle& c) {
    return Numbers({c.cx, c.cy, c.rx, c.ry});
}
inline std::string Text(const fresco::Matrix4& m) {
    return Numbers({m.m[0], m.m[1], m.m[4], m.m[5], m.m[12], m.m[13]});
}
inline std::string Text(const fresco::LinearGradient& g) {
    return Numbers({g.start.x, g.start.y, g.end.x, g.end.y});
}
inline std::string Text(const fresco::RadialGradient& g) {
    return Numbers({g.center.x, g.center.y, g.radius.x, g.radius.y});
}
inline std::string Text(const fresco::Quad& q) {
    std::string text;
    for (const fresco::Point& point : q.points)
        text += Numbers({point.x, point.y});
    return text;
}
inline std::string Text(uint32_t value) {
    return Numbers({static_cast<float>(value)});
}
inline std::string Text(float value) {
    return Numbers({value});
}
template <typename Other>
std::string Text(const Other&) {
    return "";
}

inline std::vector<std::string> Records(const fresco::CommandBuffer& buffer) {
    std::vector<std::string> lines;
    const auto* at = static_cast<const uint8_t*>(buffer.GetStream());
    const uint8_t* end = at + buffer.GetStreamSize();
    while (at < end) {
        const auto& header = *reinterpret_cast<const fresco::RecordHeader*>(at);
        [[maybe_unused]] const uint8_t* body = at + sizeof(header);
        std::string line;
        switch (static_cast<fresco::CommandType>(header.type)) {
#define QORVEX_FIELD(type, field) line += Text(record.field);
#define QORVEX_RECORD(name, tail, fields)                                                           \
    case fresco::CommandType::name: {                                                               \
        [[maybe_unused]] const auto& record = *reinterpret_cast<const fresco::name##Record*>(body); \
        line = #name;                                                                               \
        fields break;                                                                               \
    }
            FRESCO_COMMANDS(QORVEX_RECORD, QORVEX_FIELD)
#undef QORVEX_RECORD
#undef QORVEX_FIELD
            default:
                line = "?";
                break;
        }
        lines.push_back(line);
        at += header.size;
    }
    return lines;
}

class RecordTest : public LayoutTest {
  protected:
    // Records what the page's last frame left dirty.
    dsp::FrameRecord Record() {
        layout::LayoutPass pass = page.MakePass();
        dsp::RecordRequest request{caches};
        request.partialRedraw = partial;
        request.scaleX = request.scaleY = scale;
        request.showPaintRectangles = highlights;
        return dsp::RecordRendering(pass, std::move(request));
    }
    // The lines of a whole frame without its scissors.
    std::vector<std::string> Frame() {
        page.Frame();
        page.dirty.Add(layout::MakeRect(0, 0, 1000, 500));
        frame = Record();
        std::vector<std::string> lines =
            frame.buffers.empty() ? std::vector<std::string>() : Records(*frame.buffers[0]);
        EXPECT_GE(lines.size(), 5u);
        // BeginScissor, PushState, ClipRect, ClearRect unless the root hides all ... PopState
        const bool clears = lines.size() > 3 && lines[3].rfind("ClearRect", 0) == 0;
        lines.erase(lines.begin(), lines.begin() + (clears ? 4 : 3));
        lines.pop_back();
        return lines;
    }
    static std::string Join(const std::vector<std::string>& lines) {
        std::string text;
        for (const std::string& line : lines)
            text += line + "\n";
        return text;
    }
    static size_t CountOf(const std::vector<std::string>& lines, std::string_view start) {
        size_t count = 0;
        for (const std::string& line : lines)
            count += line.rfind(start, 0) == 0;
        return count;
    }

    Page page;
    dsp::RenderCaches caches;
    dsp::FrameRecord frame;
    bool partial = true;
    bool highlights = false;
    float scale = 1;
};

}  // namespace qorvex::test
