#include "fresco/fonts/system_fonts.h"

#include <string_view>
#include "fresco/core/log.h"

namespace fresco {

void SystemFonts::SetOptions(const char* options) {
    constexpr std::string_view kSwitch = "--system-fonts=";
    std::string_view text = options ? options : "";
    const size_t at = text.find(kSwitch);
    if (at == std::string_view::npos) return;
    text.remove_prefix(at + kSwitch.size());
    text = text.substr(0, text.find(' '));
    while (!text.empty()) {
        const std::string_view path = text.substr(0, text.find(':'));
        if (!path.empty()) paths_.emplace_back(path);
        text.remove_prefix(std::min(text.size(), path.size() + 1));
    }
}

void SystemFonts::ReportMissing(const char* path) {
    FRESCO_WARN("Unable to open the system font %s", path);
}

}  // namespace fresco
