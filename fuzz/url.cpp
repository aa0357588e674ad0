// Addresses: one line is the base, the next is resolved against it, the third replaces each part in turn.
#include "core/url/url.h"

#include <cstdint>
#include <string>

#include "support/engine.h"

namespace qorvex::fuzz {
namespace {

struct Lines {
    std::string_view base, relative, value;
};

Lines Split(std::string_view text) {
    std::string_view lines[3];
    for (std::string_view& line : lines) {
        const size_t end = text.find('\n');
        line = text.substr(0, end);
        text = end == std::string_view::npos ? std::string_view() : text.substr(end + 1);
    }
    return {lines[0], lines[1], lines[2]};
}

void Check(const URL& url) {
    const std::string_view text = url.GetText().view();
    Require(url.IsValid() || text.empty(), "an invalid URL acts as an empty one");
    for (const std::string_view piece : {url.GetScheme(), url.GetPort(), url.GetQuery(), url.GetFragment()})
        Require(piece.empty() || (piece.data() >= text.data() && piece.end() <= text.end()),
                "a piece lies outside of the text");
    Require(url.IsValid() == !url.GetPath().empty(), "a valid URL has a path");
    if (!url.GetScheme().empty() && !url.GetHost().empty())
        Require(url.GetOriginLikePart(true).view().starts_with(url.GetScheme()), "origin without its scheme");
    if (!url.IsValid()) return;
    for (const char c : text)
        Require(c > 0x20 && c < 0x7F, "a byte that may not stand in a URL");
    const URL again(text);
    Require(again == url && url.GetText().view() == again.GetText().view(),
            "cleaning twice changes the text");
}

void Resolve(const URL& relative, const URL& base) {
    const URL merged = relative.Merge(base);
    Check(merged);
    if (!relative.IsValid() || !base.IsValid()) return;
    if (!relative.IsRelative()) RequireSame(merged.GetText(), relative.GetText(), "an absolute URL stays");
    // A base without a scheme cannot make the other one absolute.
    else if (!base.IsRelative() && merged.IsValid())
        Require(!merged.IsRelative() || merged == relative, "a merged URL is absolute");
}

void Replace(const URL& url, std::string_view value) {
    for (uint32_t part = 0; part <= static_cast<uint32_t>(URLPart::Hash); ++part)
        Check(url.SetPart(value, static_cast<URLPart>(part)));
    // A part replaced by itself changes nothing that the accessors tell.
    if (url.IsEmpty() || url.GetQuery().empty()) return;
    const URL same = url.SetPart(url.GetQuery(), URLPart::Search);
    if (same.IsValid() && !url.GetQuery().starts_with("?"))
        RequireSame(same.GetQuery(), url.GetQuery(), "the query replaced by itself");
}

}  // namespace
}  // namespace qorvex::fuzz

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
    using namespace qorvex;
    using namespace qorvex::fuzz;
    const Input input(
        {"Cannot unset protocol in URL!", "Invalid scheme/port when checking for default port"});
    const Lines lines = Split({reinterpret_cast<const char*>(data), size});
    const URL base(lines.base);
    const URL relative(lines.relative);
    Check(base);
    Check(relative);
    Resolve(relative, base);
    Replace(base, lines.value);
    Replace(relative, lines.value);
    URL cut;
    cut.Parse(lines.base, lines.value.size());
    (void)cut.GetPath();
    return 0;
}
