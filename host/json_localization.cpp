#include "json_localization.h"

#include <rapidjson/document.h>
#include <rapidjson/error/en.h>

#include <fstream>
#include <iterator>
#include <utility>
#include <vector>

namespace qorvex::host {

bool JsonLocalization::AddText(std::string_view json, std::string& error) {
    rapidjson::Document document;
    // Nesting costs memory, not stack.
    document.Parse<rapidjson::kParseIterativeFlag>(json.data(), json.size());
    if (document.HasParseError()) {
        error = std::string(rapidjson::GetParseError_En(document.GetParseError())) + " at byte " +
                std::to_string(document.GetErrorOffset());
        return false;
    }
    if (!document.IsObject()) {
        error = "the translations are not one object";
        return false;
    }
    std::vector<std::pair<std::string, const rapidjson::Value*>> open;
    open.emplace_back(std::string(), &document);
    while (!open.empty()) {
        const auto [prefix, object] = std::move(open.back());
        open.pop_back();
        for (const auto& member : object->GetObject()) {
            std::string id = prefix + std::string(member.name.GetString(), member.name.GetStringLength());
            if (member.value.IsString())
                texts_[id].assign(member.value.GetString(), member.value.GetStringLength());
            else if (member.value.IsObject())
                open.emplace_back(id + '.', &member.value);
        }
    }
    return true;
}

bool JsonLocalization::AddFile(const std::string& path, std::string& error) {
    std::ifstream file(path, std::ios::binary);
    if (!file) {
        error = "cannot read " + path;
        return false;
    }
    const std::string text((std::istreambuf_iterator<char>(file)), std::istreambuf_iterator<char>());
    if (AddText(text, error)) return true;
    error = path + ": " + error;
    return false;
}

void JsonLocalization::Translate(const char* id, ITranslationData* result) {
    const auto found = texts_.find(id);
    if (found != texts_.end()) result->Set(found->second.data(), static_cast<unsigned>(found->second.size()));
}

const char* JsonLocalization::Translate(const char* id) {
    const auto found = texts_.find(id);
    return found == texts_.end() ? nullptr : found->second.c_str();
}

}  // namespace qorvex::host
