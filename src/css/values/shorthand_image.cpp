// Shorthands of images: background, mask, border-image.
#include "css/values/shorthands.h"
#include "css/values/value_parsers.h"
#include "css/values/value_text.h"

namespace qorvex::css {

namespace {

// The words of a value with the next one in sight, so that two can be tried as one value.
class WordStream {
  public:
    explicit WordStream(std::string_view text) : reader_(text, true) { Advance(); }

    bool AtEnd() const { return current_.empty(); }
    std::string_view current() const { return current_; }
    void Advance() {
        if (!reader_.Next(current_)) current_ = {};
    }
    bool TakeSlash() {
        if (current_ != "/") return false;
        Advance();
        return true;
    }

    // Gives `take` the longest run of up to `most` words that it accepts.
    template <class Take>
    bool TakeLongest(size_t most, Take&& take) {
        std::string_view runs[5];
        WordReader ends[5] = {reader_, reader_, reader_, reader_, reader_};
        size_t count = 0;
        WordReader reader = reader_;
        std::string_view word = current_;
        while (count < most && !word.empty() && word != "/") {
            runs[count] = std::string_view(current_.data(),
                                           static_cast<size_t>(word.data() + word.size() - current_.data()));
            ends[count++] = reader;
            if (!reader.Next(word)) break;
        }
        while (count > 0) {
            --count;
            if (!take(runs[count])) continue;
            reader_ = ends[count];
            Advance();
            return true;
        }
        return false;
    }

  private:
    WordReader reader_;
    std::string_view current_;
};

bool IsSet(const Declaration& declaration) {
    return declaration.property() != PropertyId::kUnknown;
}

// Reads the run as a value of the longhand unless it has one already.
bool TakeOnce(WordStream& words, size_t most, PropertyId id, Declaration& out) {
    if (IsSet(out)) return false;
    return words.TakeLongest(most, [&](std::string_view run) { return OperationsOf(id).parse(run, out); });
}

// "x y, x y" into the two lists.
bool ReadPositionLists(std::string_view text, Declaration& x, Declaration& y) {
    BackgroundPositionList xs, ys;
    ListReader list(text);
    std::string_view item;
    while (list.Next(item))
        if (!ParsePosition(item, xs.items.emplace_back(), ys.items.emplace_back())) return false;
    x = Declaration::Make<PropertyId::BackgroundPositionX>(std::move(xs));
    y = Declaration::Make<PropertyId::BackgroundPositionY>(std::move(ys));
    return true;
}

}  // namespace

bool ExpandBackgroundPosition(std::string_view text, ShorthandOutput& out) {
    Declaration x, y;
    if (!ReadPositionLists(text, x, y)) return false;
    out.Add(std::move(x));
    out.Add(std::move(y));
    return true;
}

bool ExpandBackground(std::string_view text, ShorthandOutput& out) {
    Declaration image, color, x, y, size, repeat;
    WordStream words(text);
    while (!words.AtEnd()) {
        if (words.TakeSlash()) {
            if (!TakeOnce(words, 2, PropertyId::BackgroundSize, size)) return false;
            continue;
        }
        bool taken =
            TakeOnce(words, 1, PropertyId::BackgroundImage, image) ||
            TakeOnce(words, 1, PropertyId::BackgroundColor, color) ||
            (!IsSet(x) &&
             words.TakeLongest(2, [&](std::string_view run) { return ReadPositionLists(run, x, y); })) ||
            TakeOnce(words, 2, PropertyId::BackgroundRepeat, repeat);
        if (!taken) return false;
    }
    out.AddOrInitial(PropertyId::BackgroundImage, image);
    out.AddOrInitial(PropertyId::BackgroundPositionX, x);
    out.AddOrInitial(PropertyId::BackgroundPositionY, y);
    out.AddOrInitial(PropertyId::BackgroundColor, color);
    out.AddOrInitial(PropertyId::BackgroundSize, size);
    out.AddOrInitial(PropertyId::BackgroundRepeat, repeat);
    return true;
}

bool ExpandMask(std::string_view text, ShorthandOutput& out) {
    Declaration image, position, size, repeat, mode, clip;
    WordStream words(text);
    while (!words.AtEnd()) {
        if (words.TakeSlash()) {
            if (!IsSet(position) || !TakeOnce(words, 2, PropertyId::MaskSize, size)) return false;
            continue;
        }
        bool taken = TakeOnce(words, 1, PropertyId::MaskImage, image) ||
                     TakeOnce(words, 2, PropertyId::MaskPosition, position) ||
                     TakeOnce(words, 2, PropertyId::MaskRepeat, repeat) ||
                     TakeOnce(words, 1, PropertyId::MaskMode, mode) ||
                     TakeOnce(words, 1, PropertyId::MaskClip, clip);
        if (!taken) return false;
    }
    out.AddOrInitial(PropertyId::MaskPosition, position);
    out.AddOrInitial(PropertyId::MaskSize, size);
    out.AddOrInitial(PropertyId::MaskImage, image);
    out.AddOrInitial(PropertyId::MaskMode, mode);
    out.AddOrInitial(PropertyId::MaskClip, clip);
    out.AddOrInitial(PropertyId::MaskRepeat, repeat);
    return true;
}

bool ExpandBorderImage(std::string_view text, ShorthandOutput& out) {
    Declaration source, slice, width, outset, repeat;
    WordStream words(text);
    TakeOnce(words, 1, PropertyId::BorderImageSource, source);
    if (TakeOnce(words, 5, PropertyId::BorderImageSlice, slice) && words.TakeSlash()) {
        // "slice / / outset" leaves the width out.
        bool hasWidth = TakeOnce(words, 4, PropertyId::BorderImageWidth, width);
        if (words.TakeSlash()) {
            if (!TakeOnce(words, 4, PropertyId::BorderImageOutset, outset)) return false;
        } else if (!hasWidth) {
            return false;
        }
    }
    TakeOnce(words, 2, PropertyId::BorderImageRepeat, repeat);
    if (!words.AtEnd()) return false;
    out.AddOrInitial(PropertyId::BorderImageSource, source);
    out.AddOrInitial(PropertyId::BorderImageSlice, slice);
    out.AddOrInitial(PropertyId::BorderImageWidth, width);
    out.AddOrInitial(PropertyId::BorderImageOutset, outset);
    out.AddOrInitial(PropertyId::BorderImageRepeat, repeat);
    return true;
}

}  // namespace qorvex::css
