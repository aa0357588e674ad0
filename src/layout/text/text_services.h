// What text layout asks of the outside. Borrowed; one set for each tree.
#pragma once

namespace fresco {
class IFontService;
}
namespace qorvex {
class IInternationalizationManager;
}

namespace qorvex::layout {

struct TextServices {
    fresco::IFontService* fonts = nullptr;         // null: no text is measured
    IInternationalizationManager* i18n = nullptr;  // null: all text runs from left to right
    bool complexText = true;  // off: glyphs stand in the order of the characters, whatever the script
};

}  // namespace qorvex::layout
