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
    // `prefix`: bytes in front of the text that the client was given too.
    Levels(const Characters& characters, size_t bytes, size_t prefix, TempVector<uint8_t>& out)
        : offsets_(characters.offsets), bytes_(bytes), prefix_(prefix), out_(out) {}

    void AddRun(unsigned from, unsigned length, unsigned level) override {
        const size_t given = size_t{from} + length;
        if (from >= prefix_ + bytes_ || given <= prefix_ || length == 0) return;
        const size_t start = std::max<size_t>(from, prefix_) - prefix_;
        const size_t end = std::min(given - prefix_, bytes_);
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
    const size_t prefix_;
    TempVector<uint8_t>& out_;
};

}  // namespace

void ResolveLevels(const TextRequest& request, const Characters& characters, TempVector<uint8_t>& levels) {
    levels.resize(characters.codes.size(), uint8_t{0});
    if (request.i18n == nullptr) return;
    const std::string_view utf8 = request.text;
    if (request.base == BaseDirection::OfText) {
        Levels result(characters, utf8.size(), 0, levels);
        request.i18n->ComputeTextDirection(utf8.data(), static_cast<unsigned>(utf8.size()), &result);
        return;
    }
    // The client takes the direction from the first letter: a mark in front stands for that letter.
    const std::string_view mark = request.base == BaseDirection::RightToLeft ? "\u200F" : "\u200E";
    TempVector<char> marked;
    marked.reserve(mark.size() + utf8.size());
    marked.append(mark.begin(), mark.end());
    marked.append(utf8.begin(), utf8.end());
    Levels result(characters, utf8.size(), mark.size(), levels);
    request.i18n->ComputeTextDirection(marked.data(), static_cast<unsigned>(marked.size()), &result);
}

}  // namespace qorvex::layout
