// Every limit that bounds work or memory which a page, a file or a peer could otherwise drive. Each constant
// says what it counts and why it has its value. This header includes nothing but standard types and may be
// included from every floor.
#pragma once

#include <cstddef>
#include <cstdint>

namespace qorvex::limits {

/// Bytes of one log line with its terminator; longer lines are cut.
inline constexpr size_t kLogLineBytes = 1024;

/// Streams that format log lines: so many threads write at once, others wait for one to come back.
inline constexpr size_t kLogStreams = 2;

/// Bytes of the default handler's stream: a whole line with thread id and time in front of it.
inline constexpr size_t kDefaultLogBytes = 2048;

/// Bytes of a block of temporary memory: enough that a usual frame stays within its first block.
inline constexpr size_t kTempBlockBytes = 512 * 1024;

/// Bytes of all font family names of a process; a page cannot make more of them than this holds.
inline constexpr size_t kFamilyNameBytes = 1024;

/// Seconds of processor time that one entry into script may take before it is stopped. A page that needs
/// longer has frozen the game; a page that loads slowly under a debugger or a sanitizer stays well below.
inline constexpr double kScriptTimeLimitSeconds = 10;
/// While a page loads, the script engine's own timers have a turn in every one of so many frames.
inline constexpr uint32_t kLoadingFramesWithoutPump = 30;

/// Smallest block of the string pool.
inline constexpr size_t kStringPoolBlockBytes = 512;

/// Object pools of a process; a thread's cache has one list for each.
inline constexpr size_t kObjectPools = 32;

/// Levels of nesting that take part in layout and painting, whose passes recurse; deeper content keeps empty
/// boxes. The flex engine takes up to 10 KB of stack a level in a checked build, so this fits the 8 MB of a
/// usual thread; web browsers cut documents at the same depth.
inline constexpr uint32_t kMaxLayoutDepth = 512;

/// Pixels, or percent, that a length of a style has at most: a hundred thousand screens. What layout adds up
/// from such lengths may be a hundred times that.
inline constexpr float kMaxLength = 1e7f;

/// Levels of a document that the HTML builder makes and layout shows; browsers stop near here too, and layout
/// walks recurse.
inline constexpr size_t kMaxDocumentDepth = 512;

/// Elements that HTML source may have open at once before the parser sees it: its work grows with the square
/// of this (5,000 take 20 ms, 100,000 take 17 s).
inline constexpr size_t kMaxSourceNesting = 4096;

/// Attributes of one tag that the parser sees: it compares each with all before it (8,192 take 0.15 s,
/// 100,000 take 25 s).
inline constexpr size_t kMaxSourceAttributes = 8192;

/// Elements that the parser may open again for formatting that was never closed: so many at least, and so
/// many for each tag of the source. Without a bound 4 KB ask for 25,000 of them, and four times that for
/// twice the source.
inline constexpr size_t kReopenedAtLeast = 4096;
inline constexpr size_t kReopenedPerTag = 16;

/// Loads that finish inside the request for them may run a script that asks for the next one; deeper than
/// this they wait for the next frame.
inline constexpr uint32_t kMaxNestedResourceEvents = 16;

/// Bytes of one resource: what a handler says by mistake must not take all memory. Text lengths have 32 bits.
inline constexpr size_t kMaxResourceBytes = size_t{1} << 30;

/// Answered requests whose response objects stay as they are, so that a client that finishes one twice, soon
/// after, touches nothing else: 64 bytes each.
inline constexpr size_t kFinishedResponses = 256;

/// Frame ids of a view that wait for Paint. A client that never paints keeps the newest so many; at 60 frames
/// a second a client that paints late has four seconds.
inline constexpr size_t kMaxWaitingFrames = 256;

/// Bytes of a value whose variables were replaced by their text: custom properties that name each other can
/// grow with every level.
inline constexpr size_t kSubstitutedTextBytes = 1024 * 1024;

/// Parsed selectors of script queries that are kept for the next query with the same text.
inline constexpr size_t kCachedQueries = 64;

/// Notes on siblings in one pass of matching, 60 bytes each: one per sibling combinator and depth in use.
inline constexpr size_t kSiblingScans = size_t{1} << 18;

/// Sets of rules whose cascade is remembered for the next element that they match.
inline constexpr size_t kCachedMatches = 2048;

/// Pixels a side of a surface that holds a blurred shadow: twice a 4K screen; a larger one would be mostly
/// out of sight.
inline constexpr size_t kMaxShadowSurfaceSide = 8192;

/// Repetitions of a gradient that are drawn one by one for one background; a smaller pattern is not seen as
/// one.
inline constexpr size_t kMaxGradientTiles = 4096;

/// Font sizes in pixels between which font-fit-mode looks: smaller text cannot be read, larger text has no
/// screen.
inline constexpr float kSmallestFitSize = 6;
inline constexpr float kLargestFitSize = 8192;

/// Characters of one font whose shapes are made ahead; more than a page of Chinese shows at once.
inline constexpr size_t kPreloadedCharacters = 4096;
/// Of texts that have to be shaped, and bytes of the longest of them: a longer one is a paragraph, whose
/// letters come in other texts too.
inline constexpr size_t kPreloadedTexts = 4096;
inline constexpr size_t kPreloadedTextBytes = 1024;

/// Bytes of a glyph table and of all pages of a bitmap font that a client gives.
inline constexpr size_t kBitmapFontBytes = 256 * 1024 * 1024;

/// Parentheses open at once in a CSS value or selector; beyond it a parse ends with "memory exhausted". Each
/// level stands for two entries of a parser stack of 10,000.
inline constexpr size_t kMaxCssNesting = 5000;

/// Rulesets that the comma-separated queries of @media blocks may add to one sheet by copying a block's
/// rules: some 30 MB of selectors. Further queries are left out.
inline constexpr size_t kMaxMediaRuleCopies = 256 * 1024;

/// Values that the @keyframes rules of one sheet may hold; a block gives one per selector and declaration, so
/// their number can grow with the square of the text.
inline constexpr size_t kMaxKeyframeValues = 64 * 1024;

}  // namespace qorvex::limits
