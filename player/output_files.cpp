#include "output_files.h"

#include <png.h>
#include <qorvex/debug_interface.h>
#include <rapidjson/stringbuffer.h>
#include <rapidjson/writer.h>

#include <cstdio>
#include <fstream>

#include "session.h"

namespace player {
namespace {

bool WriteFile(const std::string& file, const std::string& content) {
    std::ofstream stream(file, std::ios::binary);
    stream << content;
    return stream.flush().good();
}

bool WritePng(const std::string& file, qorvex::host::SoftwareRenderTarget& target) {
    const std::vector<std::uint8_t> pixels = target.Flatten();
    png_image image = {};
    image.version = PNG_IMAGE_VERSION;
    image.width = target.Width();
    image.height = target.Height();
    image.format = PNG_FORMAT_RGB;
    return png_image_write_to_file(&image, file.c_str(), 0, pixels.data(), 0, nullptr) != 0;
}

using JsonWriter = rapidjson::Writer<rapidjson::StringBuffer>;

std::string BoxesText(Session& session) {
    rapidjson::StringBuffer buffer;
    JsonWriter writer(buffer);
    writer.StartArray();
    session.Debug()->VisitElementBoxes(
        session.View(),
        [](void* out, const qorvex::ElementBox& box) {
            auto& json = *static_cast<JsonWriter*>(out);
            json.StartObject();
            json.Key("tag"), json.String(box.Tag);
            json.Key("id"), json.String(box.Id);
            json.Key("x"), json.Double(box.X);
            json.Key("y"), json.Double(box.Y);
            json.Key("width"), json.Double(box.Width);
            json.Key("height"), json.Double(box.Height);
            json.EndObject();
        },
        &writer);
    writer.EndArray();
    return std::string(buffer.GetString(), buffer.GetSize()) + "\n";
}

std::string StatsText(const std::vector<qorvex::FrameStats>& frames) {
    rapidjson::StringBuffer buffer;
    JsonWriter writer(buffer);
    writer.StartArray();
    for (const qorvex::FrameStats& frame : frames) {
        writer.StartObject();
        writer.Key("script"), writer.Double(frame.Script);
        writer.Key("style"), writer.Double(frame.Style);
        writer.Key("commit"), writer.Double(frame.Commit);
        writer.Key("layout"), writer.Double(frame.Layout);
        writer.Key("record"), writer.Double(frame.Record);
        writer.Key("paint"), writer.Double(frame.Paint);
        writer.Key("advance"), writer.Double(frame.Advance);
        writer.Key("restyled"), writer.Uint64(frame.Restyled);
        writer.Key("laid_out"), writer.Uint64(frame.LaidOut);
        writer.Key("recorded"), writer.Uint64(frame.Recorded);
        writer.Key("painted_pixels"), writer.Uint64(frame.PaintedPixels);
        writer.Key("allocations"), writer.Uint64(frame.Allocations);
        writer.EndObject();
    }
    writer.EndArray();
    return std::string(buffer.GetString(), buffer.GetSize()) + "\n";
}

bool PrintStyle(Session& session, const std::string& selector) {
    return session.Debug()->VisitComputedStyle(
        session.View(), selector.c_str(),
        [](void*, const char* name, const char* value) { std::printf("%s: %s\n", name, value); }, nullptr);
}

}  // namespace

bool WriteOutputs(Session& session, const Options& options, const std::string& capture,
                  const std::vector<qorvex::FrameStats>& stats, std::string& error) {
    const auto wrote = [&error](bool good, const std::string& file) {
        if (!good) error = "cannot write " + file;
        return good;
    };
    if (!options.png_file.empty() && !wrote(WritePng(options.png_file, session.Target()), options.png_file))
        return false;
    if (!options.boxes_file.empty() &&
        !wrote(WriteFile(options.boxes_file, BoxesText(session)), options.boxes_file)) {
        return false;
    }
    if (!options.capture_file.empty() &&
        !wrote(!capture.empty() && WriteFile(options.capture_file, capture), options.capture_file)) {
        return false;
    }
    if (!options.stats_file.empty() &&
        !wrote(WriteFile(options.stats_file, StatsText(stats)), options.stats_file)) {
        return false;
    }
    if (!options.style_selector.empty() && !PrintStyle(session, options.style_selector)) {
        error = "nothing matches " + options.style_selector;
        return false;
    }
    return true;
}

}  // namespace player
