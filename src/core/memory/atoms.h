// The constant names that the code compares by pointer, in one table. Each is a static entry that every
// StringPool holds from its construction, so `name == atoms::kHref` is one comparison of pointers whichever
// pool the name came from. Append a row to use a new name; a text stands here once only.
#pragma once

#include "core/memory/atom.h"

// clang-format off
#define QORVEX_ATOMS(X) \
    /* node names */ \
    X(kComment, "#comment") \
    X(kText, "#text") \
    X(kDocument, "#document") \
    X(kDocumentFragment, "#document-fragment") \
    /* words that attributes and properties are compared with */ \
    X(kTrue, "true") \
    X(kFalse, "false") \
    X(kModule, "module") \
    X(kButton, "button") \
    X(kPassword, "password") \
    X(kTextWord, "text") \
    X(kAuto, "auto") \
    X(kNone, "none") \
    X(kHidden, "hidden") \
    X(kSubmit, "submit") \
    X(kCheckbox, "checkbox") \
    X(kRadio, "radio") \
    X(kNumber, "number") \
    X(kEmail, "email") \
    X(kRange, "range") \
    X(kSearch, "search") \
    X(kStylesheet, "stylesheet") \
    X(kPreload, "preload") \
    X(kFont, "font") \
    X(kStyle, "style") \
    X(kImage, "image") \
    X(kScript, "script") \
    X(kLtr, "ltr") \
    X(kRtl, "rtl") \
    X(kAnonymous, "anonymous") \
    X(kTextJavascript, "text/javascript") \
    X(kTextCss, "text/css") \
    X(kLoading, "loading") \
    X(kInteractive, "interactive") \
    X(kComplete, "complete") \
    X(kJavascript, "javascript") \
    X(kUndefined, "undefined") \
    X(kUTF8, "UTF-8") \
    /* attributes */ \
    X(kId, "id") \
    X(kClass, "class") \
    X(kHref, "href") \
    X(kSrc, "src") \
    X(kRel, "rel") \
    X(kType, "type") \
    X(kAsync, "async") \
    X(kDefer, "defer") \
    X(kCharset, "charset") \
    X(kMedia, "media") \
    X(kName, "name") \
    X(kL10nId, "l10n-id") \
    X(kValue, "value") \
    X(kPlaceholder, "placeholder") \
    X(kDisabled, "disabled") \
    X(kReadonly, "readonly") \
    X(kChecked, "checked") \
    X(kRequired, "required") \
    X(kMaxlength, "maxlength") \
    X(kMinlength, "minlength") \
    X(kMin, "min") \
    X(kMax, "max") \
    X(kStep, "step") \
    X(kTabindex, "tabindex") \
    X(kDir, "dir") \
    X(kLang, "lang") \
    X(kTitle, "title") \
    X(kAlt, "alt") \
    X(kWidth, "width") \
    X(kHeight, "height") \
    X(kContent, "content") \
    X(kHttpEquiv, "http-equiv") \
    X(kTarget, "target") \
    X(kFor, "for") \
    X(kAutofocus, "autofocus") \
    X(kAutoplay, "autoplay") \
    X(kControls, "controls") \
    X(kLoop, "loop") \
    X(kMuted, "muted") \
    X(kPoster, "poster") \
    X(kSelected, "selected") \
    X(kMultiple, "multiple") \
    X(kSize, "size") \
    X(kRows, "rows") \
    X(kCols, "cols") \
    X(kContenteditable, "contenteditable") \
    X(kDraggable, "draggable") \
    X(kSpellcheck, "spellcheck") \
    X(kIs, "is") \
    X(kSlot, "slot") \
    X(kOnclick, "onclick") \
    X(kOnload, "onload") \
    X(kOnerror, "onerror") \
    X(kDataPrefix, "data-") \
    X(kCrossorigin, "crossorigin") \
    X(kIntegrity, "integrity") \
    X(kAs, "as") \
    X(kAction, "action") \
    X(kMethod, "method") \
    X(kLabel, "label") \
    X(kPattern, "pattern") \
    X(kRole, "role") \
    X(kAccesskey, "accesskey") \
    X(kData, "data") \
    /* events */ \
    X(kAbort, "abort") \
    X(kAnimationend, "animationend") \
    X(kAnimationiteration, "animationiteration") \
    X(kAnimationstart, "animationstart") \
    X(kAnimationcancel, "animationcancel") \
    X(kAuxclick, "auxclick") \
    X(kBeforeinput, "beforeinput") \
    X(kBeforeunload, "beforeunload") \
    X(kBlur, "blur") \
    X(kCancel, "cancel") \
    X(kCanplay, "canplay") \
    X(kCanplaythrough, "canplaythrough") \
    X(kChange, "change") \
    X(kClick, "click") \
    X(kClose, "close") \
    X(kCompositionend, "compositionend") \
    X(kCompositionstart, "compositionstart") \
    X(kCompositionupdate, "compositionupdate") \
    X(kContextmenu, "contextmenu") \
    X(kCopy, "copy") \
    X(kCut, "cut") \
    X(kDblclick, "dblclick") \
    X(kDOMContentLoaded, "DOMContentLoaded") \
    X(kDurationchange, "durationchange") \
    X(kEnded, "ended") \
    X(kError, "error") \
    X(kFocus, "focus") \
    X(kFocusin, "focusin") \
    X(kFocusout, "focusout") \
    X(kGamepadconnected, "gamepadconnected") \
    X(kGamepaddisconnected, "gamepaddisconnected") \
    X(kHashchange, "hashchange") \
    X(kInput, "input") \
    X(kKeydown, "keydown") \
    X(kKeypress, "keypress") \
    X(kKeyup, "keyup") \
    X(kLoad, "load") \
    X(kLoadeddata, "loadeddata") \
    X(kLoadedmetadata, "loadedmetadata") \
    X(kLoadend, "loadend") \
    X(kLoadstart, "loadstart") \
    X(kMessage, "message") \
    X(kMousedown, "mousedown") \
    X(kMouseenter, "mouseenter") \
    X(kMouseleave, "mouseleave") \
    X(kMousemove, "mousemove") \
    X(kMouseout, "mouseout") \
    X(kMouseover, "mouseover") \
    X(kMouseup, "mouseup") \
    X(kMousewheel, "mousewheel") \
    X(kOpen, "open") \
    X(kPaste, "paste") \
    X(kPause, "pause") \
    X(kPlay, "play") \
    X(kPlaying, "playing") \
    X(kPopstate, "popstate") \
    X(kProgress, "progress") \
    X(kReadystatechange, "readystatechange") \
    X(kResize, "resize") \
    X(kScroll, "scroll") \
    X(kSeeked, "seeked") \
    X(kSeeking, "seeking") \
    X(kSelect, "select") \
    X(kSlotchange, "slotchange") \
    X(kStorage, "storage") \
    X(kTimeout, "timeout") \
    X(kTimeupdate, "timeupdate") \
    X(kTouchcancel, "touchcancel") \
    X(kTouchend, "touchend") \
    X(kTouchmove, "touchmove") \
    X(kTouchstart, "touchstart") \
    X(kTransitioncancel, "transitioncancel") \
    X(kTransitionend, "transitionend") \
    X(kTransitionrun, "transitionrun") \
    X(kTransitionstart, "transitionstart") \
    X(kUnload, "unload") \
    X(kUnhandledrejection, "unhandledrejection") \
    X(kVolumechange, "volumechange") \
    X(kWaiting, "waiting") \
    X(kWheel, "wheel")
// clang-format on

namespace qorvex::atoms {

namespace detail {
#define QORVEX_ATOM_ENTRY(name, text) inline constexpr AtomEntry name##Entry{text, sizeof(text) - 1};
QORVEX_ATOMS(QORVEX_ATOM_ENTRY)
#undef QORVEX_ATOM_ENTRY
}  // namespace detail

#define QORVEX_ATOM_CONSTANT(name, text) inline constexpr Atom name{&detail::name##Entry};
QORVEX_ATOMS(QORVEX_ATOM_CONSTANT)
#undef QORVEX_ATOM_CONSTANT

}  // namespace qorvex::atoms
