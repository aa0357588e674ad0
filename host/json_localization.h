// Translations from JSON files: { "menu": { "start": "Los geht's" }, "quit": "Ende" } translates the ids
// "menu.start" and "quit".
#pragma once

#include <qorvex/text_services.h>

#include <string>
#include <string_view>
#include <unordered_map>

namespace qorvex::host {

// Read before the engine sees it, then from the main thread alone.
class JsonLocalization final : public ILocalizationManager {
  public:
    // Adds the translations of a text; ids that are there already take the new one. False with one line when
    // the text is no JSON object; values that are neither texts nor objects are left out.
    bool AddText(std::string_view json, std::string& error);
    bool AddFile(const std::string& path, std::string& error);

    [[nodiscard]] std::size_t Count() const { return texts_.size(); }

    void Translate(const char* id, ITranslationData* result) override;
    const char* Translate(const char* id) override;

  private:
    std::unordered_map<std::string, std::string> texts_;
};

}  // namespace qorvex::host
