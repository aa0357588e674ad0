// International text on ICU: what bidirectional and dictionary-broken scripts need, and case mapping.
#pragma once

#include <qorvex/text_services.h>

#include <memory>
#include <string>

namespace qorvex::host {

// Any thread; a break iterator belongs to one thread at a time.
class IcuInternationalization final : public IInternationalizationManager {
  public:
    // A locale such as "ja_JP" chooses between rules of line breaking; empty: those of the root.
    explicit IcuInternationalization(const std::string& locale = {});
    ~IcuInternationalization() override;

    // Cheap: ICU's own iterator is made when the first position is asked for. Destroyed with Destroy; it may
    // outlive this object.
    i18n::IBreakIterator* CreateBreakIterator(i18n::BreakIteratorBoundary boundary) override;
    // That of the first character with a direction of its own.
    TextDirection ComputeBaseDirection(const char* utf8, unsigned length) override;
    // Each paragraph of the text (up to a line feed) takes the direction of its first strong character.
    void ComputeTextDirection(const char* utf8, unsigned length, i18n::TextDirectionResult* result) override;

  private:
    struct Shared;
    std::shared_ptr<Shared> shared_;
};

class IcuTextTransformation final : public ITextTransformationManager {
  public:
    // Case rules differ for a few languages ("tr", "az", "lt", "nl", "el"); empty: those of none.
    explicit IcuTextTransformation(const std::string& locale = {});

    bool CaseMapCharacters(CaseOperation operation, const char* utf8, unsigned inputLength, char* out,
                           unsigned* length) override;
    bool CaseMapCharacters(CaseOperation operation, const char* utf8, unsigned inputLength,
                           ITransformationResult* result) override;

  private:
    const std::string locale_;
};

}  // namespace qorvex::host
