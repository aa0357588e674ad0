#include "icu_text_services.h"

#include <unicode/brkiter.h>
#include <unicode/casemap.h>
#include <unicode/locid.h>
#include <unicode/ubidi.h>
#include <unicode/uchar.h>
#include <unicode/utext.h>
#include <unicode/utf8.h>

#include <array>
#include <mutex>
#include <vector>

namespace qorvex::host {
namespace {

using i18n::BreakIteratorBoundary;
using i18n::kBreakIteratorDone;
using IcuIterator = std::unique_ptr<icu::BreakIterator>;

IcuIterator MakeIcuIterator(BreakIteratorBoundary boundary, const icu::Locale& locale) {
    using Maker = icu::BreakIterator* (*)(const icu::Locale&, UErrorCode&);
    static constexpr std::array<Maker, 4> kMakers = {
        icu::BreakIterator::createCharacterInstance, icu::BreakIterator::createWordInstance,
        icu::BreakIterator::createLineInstance, icu::BreakIterator::createSentenceInstance};
    UErrorCode fault = U_ZERO_ERROR;
    IcuIterator made(kMakers[static_cast<std::size_t>(boundary)](locale, fault));
    return U_SUCCESS(fault) ? std::move(made) : nullptr;
}

// What one call of ComputeTextDirection works in; kept for the next one.
struct BidiScratch {
    BidiScratch() : bidi(ubidi_open()) {}
    ~BidiScratch() { ubidi_close(bidi); }
    BidiScratch(const BidiScratch&) = delete;

    UBiDi* bidi;
    std::vector<UChar> text;
    std::vector<unsigned> offsets;  // in the UTF-8 text, for each code unit and the end
};

void ToUtf16(const char* utf8, unsigned length, BidiScratch& out) {
    out.text.clear();
    out.offsets.clear();
    for (int32_t at = 0; at < static_cast<int32_t>(length);) {
        const auto offset = static_cast<unsigned>(at);
        UChar32 code = 0;
        U8_NEXT_OR_FFFD(utf8, at, static_cast<int32_t>(length), code);
        if (code > 0xFFFF) {
            out.text.push_back(U16_LEAD(code));
            out.offsets.push_back(offset);
            code = U16_TRAIL(code);
        }
        out.text.push_back(static_cast<UChar>(code));
        out.offsets.push_back(offset);
    }
    out.offsets.push_back(length);
}

// Letters, their marks and punctuation of Hebrew and Arabic, all of which stand at level 1 where no letter or
// digit of another direction is near.
bool IsBackwardOrNeutral(unsigned code) {
    if (code < 0x80) {
        const unsigned letter = code | 0x20;
        return code >= 0x20 && code != 0x7F && !(code >= '0' && code <= '9') &&
               !(letter >= 'a' && letter <= 'z');
    }
    return (code >= 0x5D0 && code <= 0x5EA) || (code >= 0x61B && code <= 0x65F && code != 0x61C) ||
           code == 0x60C || (code >= 0x66E && code <= 0x6D3);
}

// Whether the whole text is one backward run beyond doubt. Spares ICU what most text of these scripts is.
bool IsPlainlyBackward(const char* utf8, unsigned length) {
    bool letters = false;
    for (unsigned i = 0; i < length; ++i) {
        unsigned code = static_cast<unsigned char>(utf8[i]);
        if (code >= 0x80) {
            if (code < 0xC2 || code > 0xDF || ++i == length) return false;
            const unsigned trail = static_cast<unsigned char>(utf8[i]);
            if ((trail & 0xC0) != 0x80) return false;
            code = (code & 0x1F) << 6 | (trail & 0x3F);
            letters = letters || (code >= 0x5D0 && code <= 0x5EA) || (code >= 0x620 && code <= 0x64A);
        }
        if (!IsBackwardOrNeutral(code)) return false;
    }
    return letters;
}

}  // namespace

// Prototypes of break iterators, which are copied since making one reads its rules anew.
struct IcuInternationalization::Shared {
    explicit Shared(const std::string& name) : locale(name.empty() ? "root" : name.c_str()) {}

    IcuIterator NewIterator(BreakIteratorBoundary boundary) {
        const std::lock_guard lock(mutex);
        IcuIterator& prototype = prototypes[static_cast<std::size_t>(boundary)];
        if (!prototype) prototype = MakeIcuIterator(boundary, locale);
        return IcuIterator(prototype ? prototype->clone() : nullptr);
    }

    std::unique_ptr<BidiScratch> TakeScratch() {
        const std::lock_guard lock(mutex);
        if (scratch.empty()) return std::make_unique<BidiScratch>();
        std::unique_ptr<BidiScratch> taken = std::move(scratch.back());
        scratch.pop_back();
        return taken;
    }
    void ReturnScratch(std::unique_ptr<BidiScratch> used) {
        const std::lock_guard lock(mutex);
        scratch.push_back(std::move(used));
    }

    const icu::Locale locale;
    std::mutex mutex;
    std::array<IcuIterator, 4> prototypes;
    std::vector<std::unique_ptr<BidiScratch>> scratch;
};

namespace {

// ICU's iterator answers questions only; the position is kept here, so that asking does not move it.
template <class Shared>
class LazyBreakIterator final : public i18n::IBreakIterator {
  public:
    LazyBreakIterator(std::shared_ptr<Shared> shared, BreakIteratorBoundary boundary)
        : shared_(std::move(shared)), boundary_(boundary) {}

    void SetText(const char* utf8, unsigned length) override {
        text_ = utf8;
        length_ = static_cast<int>(length);
        position_ = 0;
        stale_ = true;
    }
    void ClearText() override { SetText(nullptr, 0); }
    void ResetToBeginning() override { position_ = 0; }
    void ResetToEnd() override { position_ = length_; }
    int MoveToNext() override { return MoveToCandidateAfter(position_); }
    int MoveToCandidateAfter(int position) override { return Keep(GetBoundaryAfter(position)); }
    int MoveToPrevious() override {
        return Keep(Prepare() && position_ > 0 ? icu_->preceding(position_) : kBreakIteratorDone);
    }
    int GetCurrentPosition() override { return position_; }
    void Restart(const char* utf8, unsigned length) override { SetText(utf8, length); }
    int GetBoundaryAfter(int position) override {
        if (position >= length_ || !Prepare()) return kBreakIteratorDone;
        const int32_t found = position < 0 ? icu_->first() : icu_->following(position);
        return found == icu::BreakIterator::DONE ? kBreakIteratorDone : found;
    }
    void Destroy() override { delete this; }

  private:
    int Keep(int position) {
        if (position != kBreakIteratorDone) position_ = position;
        return position;
    }
    bool Prepare() {
        if (text_ == nullptr) return false;
        if (!icu_) icu_ = shared_->NewIterator(boundary_);
        if (!icu_) return false;
        if (!stale_) return true;
        UErrorCode fault = U_ZERO_ERROR;
        UText text = UTEXT_INITIALIZER;
        utext_openUTF8(&text, text_, length_, &fault);
        icu_->setText(&text, fault);
        utext_close(&text);
        stale_ = U_FAILURE(fault);
        return !stale_;
    }

    const std::shared_ptr<Shared> shared_;
    const BreakIteratorBoundary boundary_;
    IcuIterator icu_;
    const char* text_ = nullptr;
    int length_ = 0;
    int position_ = 0;
    bool stale_ = true;  // ICU has another text
};

}  // namespace

IcuInternationalization::IcuInternationalization(const std::string& locale)
    : shared_(std::make_shared<Shared>(locale)) {}

IcuInternationalization::~IcuInternationalization() = default;

i18n::IBreakIterator* IcuInternationalization::CreateBreakIterator(BreakIteratorBoundary boundary) {
    return new LazyBreakIterator<Shared>(shared_, boundary);
}

TextDirection IcuInternationalization::ComputeBaseDirection(const char* utf8, unsigned length) {
    for (int32_t at = 0; at < static_cast<int32_t>(length);) {
        UChar32 code = 0;
        U8_NEXT_OR_FFFD(utf8, at, static_cast<int32_t>(length), code);
        switch (u_charDirection(code)) {
            case U_LEFT_TO_RIGHT:
                return TextDirection::LeftToRight;
            case U_RIGHT_TO_LEFT:
            case U_RIGHT_TO_LEFT_ARABIC:
                return TextDirection::RightToLeft;
            default:
                break;
        }
    }
    return TextDirection::LeftToRight;
}

void IcuInternationalization::ComputeTextDirection(const char* utf8, unsigned length,
                                                   i18n::TextDirectionResult* result) {
    if (length == 0) return;
    if (IsPlainlyBackward(utf8, length)) return result->AddRun(0, length, 1);
    std::unique_ptr<BidiScratch> scratch = shared_->TakeScratch();
    ToUtf16(utf8, length, *scratch);
    UErrorCode fault = U_ZERO_ERROR;
    const auto count = static_cast<int32_t>(scratch->text.size());
    ubidi_setPara(scratch->bidi, scratch->text.data(), count, UBIDI_DEFAULT_LTR, nullptr, &fault);
    const UBiDiLevel* levels = ubidi_getLevels(scratch->bidi, &fault);
    for (int32_t start = 0; U_SUCCESS(fault) && start < count;) {
        int32_t end = start + 1;
        while (end < count && levels[end] == levels[start])
            ++end;
        const unsigned first = scratch->offsets[static_cast<std::size_t>(start)];
        result->AddRun(first, scratch->offsets[static_cast<std::size_t>(end)] - first, levels[start]);
        start = end;
    }
    shared_->ReturnScratch(std::move(scratch));
}

IcuTextTransformation::IcuTextTransformation(const std::string& locale) : locale_(locale) {}

namespace {

// CSS capitalizes the first letter of a word and leaves the others alone.
constexpr uint32_t kTitleOptions = U_TITLECASE_NO_LOWERCASE;

void MapCase(CaseOperation operation, const std::string& locale, const char* utf8, unsigned length,
             icu::ByteSink& sink, UErrorCode& fault) {
    const icu::StringPiece text(utf8, static_cast<int32_t>(length));
    switch (operation) {
        case CaseOperation::ToUpper:
            return icu::CaseMap::utf8ToUpper(locale.c_str(), 0, text, sink, nullptr, fault);
        case CaseOperation::ToLower:
            return icu::CaseMap::utf8ToLower(locale.c_str(), 0, text, sink, nullptr, fault);
        case CaseOperation::Capitalize:
            return icu::CaseMap::utf8ToTitle(locale.c_str(), kTitleOptions, nullptr, text, sink, nullptr,
                                             fault);
    }
}

}  // namespace

bool IcuTextTransformation::CaseMapCharacters(CaseOperation operation, const char* utf8, unsigned inputLength,
                                              char* out, unsigned* length) {
    if (*length == 0) return false;
    UErrorCode fault = U_ZERO_ERROR;
    icu::CheckedArrayByteSink sink(out, static_cast<int32_t>(*length) - 1);
    MapCase(operation, locale_, utf8, inputLength, sink, fault);
    if (U_FAILURE(fault) || sink.Overflowed()) return false;
    *length = static_cast<unsigned>(sink.NumberOfBytesWritten());
    out[*length] = '\0';
    return true;
}

bool IcuTextTransformation::CaseMapCharacters(CaseOperation operation, const char* utf8, unsigned inputLength,
                                              ITransformationResult* result) {
    UErrorCode fault = U_ZERO_ERROR;
    std::string mapped;
    icu::StringByteSink<std::string> sink(&mapped);
    MapCase(operation, locale_, utf8, inputLength, sink, fault);
    if (U_FAILURE(fault)) return false;
    result->Set(mapped.data(), static_cast<unsigned>(mapped.size()));
    return true;
}

}  // namespace qorvex::host
