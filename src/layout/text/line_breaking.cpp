#include "layout/text/line_breaking.h"

#include <qorvex/text_services.h>

#include <limits>

#include "layout/text/complex_ranges.h"

namespace qorvex::layout {

namespace {

// Room for rounding when a text is laid out in exactly its own width.
constexpr float kSlack = 0.01f;

bool IsAsciiPunctuation(uint32_t code) {
    return (code >= '!' && code <= '/') || (code >= ':' && code <= '@') || (code >= '[' && code <= '`') ||
           (code >= '{' && code <= '~');
}

// Letters of alphabets that part words by spaces, between two of which no line ends (Unicode Annex 14, LB28).
bool IsSpacedLetter(uint32_t code) {
    if (code < 0x80) return (code | 0x20) >= 'a' && (code | 0x20) <= 'z';
    return (code >= 0xC0 && code <= 0x24F) || (code >= 0x388 && code <= 0x481) ||
           (code >= 0x48A && code <= 0x52F) || (code >= 0x5D0 && code <= 0x5EA) ||
           (code >= 0x620 && code <= 0x64A);
}

// One pass over the characters. A word grows until a break is possible, then joins the line or starts the
// next one; spaces between words count only when a word follows them on the same line.
class LineBreaker {
  public:
    LineBreaker(const BreakRequest& request, TempVector<LineSpan>& out)
        : request_(request),
          out_(out),
          wraps_(WrapsLines(request.style.whiteSpace) && !std::isnan(request.available)),
          available_(request.available + kSlack),
          lineWidth_(request.firstLineOffset) {}

    void Run() {
        const auto count = static_cast<uint32_t>(request_.characters.codes.size());
        for (uint32_t i = 0; i < count; ++i) {
            switch (ClassOf(request_.characters.codes[i])) {
                case CharacterClass::LineFeed:
                    FinishWord(i);
                    EndLine(i, i + 1, true);
                    break;
                case CharacterClass::Space:
                    FinishWord(i);
                    pendingSpace_ += request_.advances[i];
                    wordStart_ = i + 1;
                    break;
                case CharacterClass::Other:
                    AddCharacter(i);
                    break;
            }
        }
        FinishWord(count);
        EndLine(count, count, true);
    }

  private:
    void AddCharacter(uint32_t i) {
        const float advance = request_.advances[i];
        const bool whole = request_.clusterStarts == nullptr || request_.clusterStarts[i] != 0;
        if (i > wordStart_ && wraps_ && whole && MayBreakBefore(i, advance)) {
            FinishWord(i);
            wordStart_ = i;
        }
        wordWidth_ += advance;
    }

    bool MayBreakBefore(uint32_t i, float advance) {
        switch (request_.style.overflowWrap) {
            case css::OverflowWrapMode::Anywhere:
                return true;
            case css::OverflowWrapMode::BreakWord:
                if (wordWidth_ + advance > available_) return true;
                break;
            default:
                break;
        }
        return request_.iterator != nullptr && IsCandidate(i);
    }

    // Not behind ASCII punctuation, where a dictionary of line breaks would cut paths and numbers; two other
    // ASCII characters are never parted.
    bool IsCandidate(uint32_t i) {
        const uint32_t before = request_.characters.codes[i - 1];
        const uint32_t code = request_.characters.codes[i];
        if (before < 0x80 && (code < 0x80 || IsAsciiPunctuation(before))) return false;
        // What the rules say at once need not be asked for.
        if (IsSpacedLetter(before) && IsSpacedLetter(code)) return false;
        const auto offset = static_cast<int>(request_.characters.offsets[i]);
        // Until the boundary that was found last there is no other one.
        if (offset < nextCandidate_) return false;
        if (offset > nextCandidate_) nextCandidate_ = request_.iterator->GetBoundaryAfter(offset - 1);
        if (nextCandidate_ < 0) nextCandidate_ = std::numeric_limits<int>::max();
        return nextCandidate_ == offset;
    }

    // The word from wordStart_ to `end` joins the line, or the line ends before it.
    void FinishWord(uint32_t end) {
        if (end == wordStart_) return;
        const bool first = lineEnd_ == lineStart_ && lineWidth_ <= 0;
        const float hyphen = request_.characters.codes[end - 1] == kSoftHyphen ? request_.hyphen : 0;
        if (wraps_ && !first && lineWidth_ + pendingSpace_ + wordWidth_ + hyphen > available_) {
            EndLine(lineEnd_, wordStart_, false);
        }
        lineWidth_ += pendingSpace_ + wordWidth_;
        lineEnd_ = end;
        wordStart_ = end;
        pendingSpace_ = wordWidth_ = 0;
    }

    void EndLine(uint32_t end, uint32_t next, bool paragraph) {
        // Spaces before a line feed stay when white space is kept.
        if (paragraph && !CollapsesSpaces(request_.style.whiteSpace)) {
            lineWidth_ += pendingSpace_;
        } else {
            end = lineEnd_;
        }
        const float offset = out_.empty() ? request_.firstLineOffset : 0;
        out_.push_back({lineStart_, end, next, lineWidth_ - offset, paragraph});
        lineStart_ = lineEnd_ = next;
        if (wordStart_ < next) wordStart_ = next;
        lineWidth_ = pendingSpace_ = 0;
    }

    const BreakRequest& request_;
    TempVector<LineSpan>& out_;
    const bool wraps_;
    const float available_;
    uint32_t lineStart_ = 0;
    uint32_t lineEnd_ = 0;  // behind the last word of the line
    uint32_t wordStart_ = 0;
    float lineWidth_;
    float wordWidth_ = 0;
    float pendingSpace_ = 0;
    int nextCandidate_ = -1;
};

}  // namespace

void BreakLines(const BreakRequest& request, TempVector<LineSpan>& out) {
    LineBreaker(request, out).Run();
}

}  // namespace qorvex::layout
