// Language services that a client may provide: translation, case mapping, and what bidirectional and
// dictionary-broken scripts need. All of them are optional (null in SystemSettings).
#pragma once

#include <cstdint>

namespace qorvex {

// Receives a translation. Implemented by the engine; valid during the call. The text is copied.
class ITranslationData {
  public:
    virtual void Set(const char* text, unsigned length) = 0;

  protected:
    virtual ~ITranslationData() = default;
};

// Serves elements with a "data-l10n-id" attribute and engine.translate. Main thread.
class ILocalizationManager {
  public:
    virtual ~ILocalizationManager() = default;
    // Answers through result before it returns; leaving it alone falls back to the operation below.
    virtual void Translate(const char* id, ITranslationData* result) { (void)id, (void)result; }
    // The older form. The result must stay valid until the next call; null means no translation.
    virtual const char* Translate(const char* id) {
        (void)id;
        return nullptr;
    }
};

enum class CaseOperation : std::uint32_t { ToUpper = 0, ToLower = 1, Capitalize = 2 };

// Receives case-mapped text of any length. Implemented by the engine; valid during the call.
class ITransformationResult {
  public:
    virtual void Set(const char* utf8, unsigned length) = 0;

  protected:
    virtual ~ITransformationResult() = default;
};

// Serves "text-transform". Main thread.
class ITextTransformationManager {
  public:
    virtual ~ITextTransformationManager() = default;
    // Writes zero-terminated text of at most *length bytes to out and the written size to *length. The buffer
    // has four bytes for each byte of the input and one more. False: not done, try the next form.
    virtual bool CaseMapCharacters(CaseOperation operation, const char* utf8, unsigned inputLength, char* out,
                                   unsigned* length) {
        (void)operation, (void)utf8, (void)inputLength, (void)out, (void)length;
        return false;
    }
    virtual bool CaseMapCharacters(CaseOperation operation, const char* utf8, unsigned inputLength,
                                   ITransformationResult* result) {
        (void)operation, (void)utf8, (void)inputLength, (void)result;
        return false;
    }
};

namespace i18n {

enum class BreakIteratorBoundary : std::uint32_t { Character = 0, Word = 1, Line = 2, Sentence = 3 };

constexpr int kBreakIteratorDone = -1;

// Boundaries in one text, as byte positions. Made by the client, destroyed by the engine through Destroy.
// Used by one thread at a time, which may be the layout thread.
class IBreakIterator {
  public:
    virtual ~IBreakIterator() = default;
    // The text stays valid until ClearText or the next SetText.
    virtual void SetText(const char* utf8, unsigned length) = 0;
    virtual void ClearText() = 0;
    virtual void ResetToBeginning() = 0;
    virtual void ResetToEnd() = 0;
    // The moves return the new position, or kBreakIteratorDone.
    virtual int MoveToNext() = 0;
    virtual int MoveToCandidateAfter(int position) = 0;
    virtual int MoveToPrevious() = 0;
    virtual int GetCurrentPosition() = 0;
    // SetText and ResetToBeginning in one.
    virtual void Restart(const char* utf8, unsigned length) = 0;
    // The boundary that follows position, without moving.
    virtual int GetBoundaryAfter(int position) = 0;
    virtual void Destroy() = 0;
};

// Receives the runs of a bidirectional text in logical order. Implemented by the engine; valid during the
// call.
class TextDirectionResult {
  public:
    // start and length in bytes; an odd level is right-to-left (Unicode Annex 9).
    virtual void AddRun(unsigned start, unsigned length, unsigned level) = 0;

  protected:
    virtual ~TextDirectionResult() = default;
};

}  // namespace i18n

enum class TextDirection : std::uint32_t { LeftToRight = 0, RightToLeft = 1 };

// Needed for bidirectional text and for line breaking beyond the engine's own rules. May be called on the
// layout thread and on the main thread at the same time.
class IInternationalizationManager {
  public:
    virtual ~IInternationalizationManager() = default;
    virtual i18n::IBreakIterator* CreateBreakIterator(i18n::BreakIteratorBoundary boundary) {
        (void)boundary;
        return nullptr;
    }
    virtual TextDirection ComputeBaseDirection(const char* utf8, unsigned length) {
        (void)utf8, (void)length;
        return TextDirection::LeftToRight;
    }
    virtual void ComputeTextDirection(const char* utf8, unsigned length, i18n::TextDirectionResult* result) {
        (void)utf8, (void)length, (void)result;
    }
};

}  // namespace qorvex
