// Custom properties and the expressions that use them, down a chain of elements: each line of the input is
// the style attribute of the next one. A second round gives the first element the last line, so that
// everything changes.
#include <cstdint>

#include "core/limits.h"
#include "support/engine.h"
#include "support/style_checks.h"

namespace qorvex::fuzz {
namespace {

constexpr std::string_view kBody = "<div id=e0><div id=e1><div id=e2><p id=e3>text";
constexpr const char* kIds[] = {"e0", "e1", "e2", "e3"};

void Run(std::string_view text) {
    StyledPage page(kBody);
    std::string_view line;
    for (const char* id : kIds) {
        const size_t end = text.find('\n');
        line = text.substr(0, end);
        text = end == std::string_view::npos ? std::string_view() : text.substr(end + 1);
        page.document().GetElementById(id)->SetInlineStyleText(line);
    }
    page.Solve();
    for (const char* id : kIds)
        CheckComputedStyle(page.document().GetElementById(id)->GetStyle());
    page.document().GetElementById(kIds[0])->SetInlineStyleText(line);
    page.Solve();
    page.document().GetElementById(kIds[0])->SetInlineStyleText({});
    page.Solve();
    CheckComputedStyle(page.document().GetElementById(kIds[3])->GetStyle());
}

}  // namespace
}  // namespace qorvex::fuzz

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
    const qorvex::fuzz::Input input;
    qorvex::fuzz::Run({reinterpret_cast<const char*>(data), size});
    return 0;
}
