#include "layout/text/direction_runs.h"

#include <qorvex/text_services.h>

#include <algorithm>

namespace qorvex::layout {

namespace {

// The deepest level of Unicode Annex 9.
constexpr unsigned kMaxLevel = 126;

// Runs may come in any order, overlap or reach beyond the text: what the client says last holds.
class ByteLevels final : public i18n::TextDirectionResult {
  public:
    explicit ByteLevels(std::span<uint8_t> out) : out_(out) {}

    void AddRun(unsigned from, unsigned length, unsigned level) override {
        if (from >= out_.size()) return;
        std::fill_n(out_.begin() + from, std::min<size_t>(length, out_.size() - from),
                    static_cast<uint8_t>(std::min(level, kMaxLevel)));
    }

  private:
    const std::span<uint8_t> out_;
};

}  // namespace

void ResolveByteLevels(IInternationalizationManager& manager, std::string_view text, std::span<uint8_t> out) {
    ByteLevels result(out);
    manager.ComputeTextDirection(text.data(), static_cast<unsigned>(text.size()), &result);
}

void ResolveLevels(const TextRequest& request, const Characters& characters, TempVector<uint8_t>& levels) {
    levels.resize(characters.codes.size(), uint8_t{0});
    const uint8_t* bytes = request.levels;
    TempVector<uint8_t> asked;
    if (bytes == nullptr) {
        if (request.i18n == nullptr) return;
        asked.resize(request.text.size(), uint8_t{0});
        ResolveByteLevels(*request.i18n, request.text, {asked.data(), asked.size()});
        bytes = asked.data();
    }
    for (size_t i = 0; i < levels.size(); ++i)
        levels[i] = bytes[characters.offsets[i]];
}

}  // namespace qorvex::layout
