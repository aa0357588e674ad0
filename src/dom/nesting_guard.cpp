#include "dom/nesting_guard.h"

#include <algorithm>
#include <utility>

#include "core/limits.h"
#include "css/values/html_tags.h"
#include "dom/ascii.h"
#include "dom/open_formatting.h"

namespace qorvex::dom {

using css::TagId;

namespace {

struct Tag {
    size_t start = 0;
    size_t attributes = 0;  // behind the name
    size_t end = 0;         // behind the ">"
    size_t surplus = 0;     // where the attributes begin that are too many; 0 without
    TagId id = TagId::Unknown;
    bool closing = false;
    bool self_closing = false;
};

// Elements that never stay open, or that another start tag closes: they do not nest by themselves.
bool StaysOpen(const Tag& tag) {
    switch (tag.id) {
        case TagId::Area:
        case TagId::Base:
        case TagId::Br:
        case TagId::Col:
        case TagId::Embed:
        case TagId::Hr:
        case TagId::Img:
        case TagId::Input:
        case TagId::Link:
        case TagId::Meta:
        case TagId::Param:
        case TagId::Source:
        case TagId::Track:
        case TagId::Wbr:
        case TagId::KeyGen:
        case TagId::Html:
        case TagId::Head:
        case TagId::Body:
        case TagId::P:
        case TagId::Li:
        case TagId::Dt:
        case TagId::Dd:
        case TagId::Option:
        case TagId::OptGroup:
        case TagId::Tr:
        case TagId::Td:
        case TagId::Th:
        case TagId::TBody:
        case TagId::THead:
        case TagId::TFoot:
        case TagId::ColGroup:
        case TagId::Caption:
        case TagId::Rb:
        case TagId::Rt:
        case TagId::Rtc:
        case TagId::Rp:
            return false;
        default:
            return true;
    }
}

// Elements whose content is text up to their end tag.
bool HoldsRawText(TagId id) {
    return id == TagId::Script || id == TagId::Style || id == TagId::TextArea || id == TagId::Title ||
           id == TagId::Xmp || id == TagId::IFrame || id == TagId::NoEmbed || id == TagId::NoFrames;
}

class TagScanner {
  public:
    explicit TagScanner(std::string_view source) : source_(source) {}

    bool Next(Tag& tag) {
        while ((position_ = source_.find('<', position_)) != std::string_view::npos) {
            const std::string_view rest = source_.substr(position_);
            if (rest.starts_with("<!--")) {
                Skip("-->", 4);
                continue;
            }
            const bool closing = rest.size() > 1 && rest[1] == '/';
            const size_t name = closing ? 2 : 1;
            const bool is_tag = rest.size() > name && (IsAsciiLower(rest[name]) || IsAsciiUpper(rest[name]));
            if (!is_tag) {
                ++position_;
                continue;
            }
            ReadTag(tag, closing, position_ + name);
            return true;
        }
        return false;
    }

  private:
    void Skip(std::string_view terminator, size_t from) {
        const size_t end = source_.find(terminator, position_ + from);
        position_ = end == std::string_view::npos ? source_.size() : end + terminator.size();
    }

    void ReadTag(Tag& tag, bool closing, size_t name) {
        tag.start = position_;
        tag.closing = closing;
        size_t end = name;
        char upper[24];
        size_t length = 0;
        while (end < source_.size() && !IsAsciiSpace(source_[end]) && source_[end] != '>' &&
               source_[end] != '/') {
            if (length < sizeof(upper)) upper[length++] = ToAsciiUpper(source_[end]);
            ++end;
        }
        tag.id = css::TagLookup({upper, length});
        tag.attributes = end;
        char quote = 0;
        bool between = false;
        size_t attributes = 0;
        tag.surplus = 0;
        for (; end < source_.size(); ++end) {
            const char c = source_[end];
            if (quote) {
                if (c == quote) quote = 0;
            } else if (c == '>') {
                break;
            } else if ((c == '"' || c == '\'') && source_[end - 1] == '=') {
                quote = c;
            } else if (IsAsciiSpace(c) || c == '/') {
                between = true;
            } else if (std::exchange(between, false) && ++attributes > limits::kMaxSourceAttributes) {
                if (tag.surplus == 0) tag.surplus = end;
            }
        }
        tag.self_closing = end < source_.size() && source_[end - 1] == '/';
        tag.end = position_ = std::min(end + 1, source_.size());
        if (!closing && HoldsRawText(tag.id)) SkipRawText(std::string_view(upper, length));
    }

    // Stops in front of the end tag.
    void SkipRawText(std::string_view upper_name) {
        while ((position_ = source_.find("</", position_)) != std::string_view::npos) {
            if (EqualsIgnoringAsciiCase(source_.substr(position_ + 2, upper_name.size()), upper_name)) return;
            position_ += 2;
        }
        position_ = source_.size();
    }

    std::string_view source_;
    size_t position_ = 0;
};

// Every limit is further away than the tags that fit in this.
constexpr size_t kHarmlessSize = 256;
static_assert((kHarmlessSize / 3) * (kHarmlessSize / 3) / 4 < limits::kReopenedAtLeast);

}  // namespace

TamedSource TameSource(std::string_view source, TaggedString<MemoryTag::DOM>& rewritten) {
    TamedSource done;
    // In less no tags fit that ask for so much.
    if (source.size() < kHarmlessSize) return done;
    const auto blank = [&](size_t start, size_t end) {
        if (rewritten.empty()) rewritten = source;
        std::fill(rewritten.data() + start, rewritten.data() + end, ' ');
    };
    TagScanner scanner(source);
    OpenFormatting formatting;
    Tag tag;
    size_t open = 0;
    size_t blanked = 0;  // start tags whose end tags have to go too
    while (scanner.Next(tag)) {
        if (!done.formatting) {
            const std::string_view attributes = source.substr(tag.attributes, tag.end - tag.attributes);
            done.formatting =
                !(tag.closing ? formatting.TakeEnd(tag.id) : formatting.TakeStart(tag.id, attributes));
        }
        // No tag is left that could open them again.
        if (done.formatting && !HoldsRawText(tag.id)) {
            blank(tag.start, tag.end);
            continue;
        }
        if (tag.surplus) {
            done.attributes = true;
            // All but the sign that ends the tag.
            const bool ends = source[tag.end - 1] == '>';
            blank(tag.surplus, tag.end - (ends ? 1 : 0) - (ends && tag.self_closing ? 1 : 0));
        }
        // Content of raw text must not turn into text of the page.
        if (!StaysOpen(tag) || tag.self_closing || HoldsRawText(tag.id)) continue;
        if (tag.closing) {
            if (blanked == 0) {
                if (open > 0) --open;
                continue;
            }
            --blanked;
        } else if (open < limits::kMaxSourceNesting) {
            ++open;
            continue;
        } else {
            ++blanked;
        }
        done.nesting = true;
        blank(tag.start, tag.end);
    }
    return done;
}

}  // namespace qorvex::dom
