#include "layout/text/direction_runs.h"

#include <qorvex/text_services.h>

#include <algorithm>

namespace qorvex::layout {

namespace {

// The deepest level of Unicode Annex 9.
constexpr unsigned kMaxLevel = 126;

// Runs may come in any order, overlap or reach beyond the text: what the client says last holds.
class Levels final : public i18n::TextDirectionResult {
  public:
    Levels(const Characters& characters, size_t bytes, TempVector<uint8_t>& out)
        : offsets_(characters.offsets), bytes_(bytes), out_(out) {}

    void AddRun(unsigned start, unsigned length, unsigned level) override {
        if (start >= bytes_ || length == 0) return;
        const size_t end = start + std::min<size_t>(length, bytes_ - start);
        const size_t first = CharacterAt(start);
        const size_t last = CharacterAt(end);
        std::fill(out_.begin() + first, out_.begin() + last,
                  static_cast<uint8_t>(std::min(level, kMaxLevel)));
    }

  private:
    size_t CharacterAt(size_t offset) const {
        return static_cast<size_t>(std::lower_bound(offsets_.begin(), offsets_.end(), offset) -
                                   offsets_.begin());
    }

    const TempVector<uint32_t>& offsets_;
    const size_t bytes_;
    TempVector<uint8_t>& out_;
};

}  // namespace

void ResolveLevels(std::string_view utf8, const Characters& characters, IInternationalizationManager* i18n,
                   TempVector<uint8_t>& levels) {
    levels.resize(characters.codes.size(), uint8_t{0});
    if (i18n == nullptr) return;
    Levels result(characters, utf8.size(), levels);
    i18n->ComputeTextDirection(utf8.data(), static_cast<unsigned>(utf8.size()), &result);
}

}  // namespace qorvex::layout
