// What a document asks of the view that shows it. Implemented by the view; a plain double serves the tests.
// Every operation runs on the view's script thread. The host outlives its documents.
#pragma once

#include <cstdint>
#include <string_view>

#include "core/memory/string_pool.h"
#include "core/tasks/task_system.h"

namespace qorvex {
class URL;
class IInternationalizationManager;
class ILocalizationManager;
class ITextTransformationManager;
}  // namespace qorvex

namespace qorvex::dsp {
class DirtyRegion;
}

namespace qorvex::layout {
class FontManager;
class IFontResolver;
}  // namespace qorvex::layout

namespace qorvex::dom {

class Document;
class IImageLoader;
class ISVGLoader;
class Node;

struct HostSize {
    uint32_t width = 0;
    uint32_t height = 0;
};

class IDocumentHost {
  public:
    virtual ~IDocumentHost() = default;

    virtual StringPool& GetStringPool() = 0;
    virtual TaskFamilyHandle GetTaskFamily() = 0;
    virtual uint32_t GetViewId() const = 0;
    virtual HostSize GetViewSize() const = 0;
    virtual bool AreComplexSelectorsEnabled() const = 0;
    // Null without fonts (server pages, some tests): text is then measured on the layout side only.
    virtual layout::FontManager* GetFontManager() { return nullptr; }
    // The same fonts as style solving sees them; null without fonts.
    virtual layout::IFontResolver* GetFontResolver() { return nullptr; }
    // Where the pointer is, and what it holds down; null for none. Selectors ask.
    virtual Node* GetHoveredNode() const { return nullptr; }
    virtual Node* GetActiveNode() const { return nullptr; }
    virtual ILocalizationManager* GetLocalizationManager() { return nullptr; }
    virtual ITextTransformationManager* GetTextTransformationManager() { return nullptr; }
    virtual IInternationalizationManager* GetInternationalizationManager() { return nullptr; }

    // Null where nothing is painted: images are then not asked for.
    virtual IImageLoader* GetImageLoader() { return nullptr; }
    virtual ISVGLoader* GetSVGLoader() { return nullptr; }

    // What has to be painted anew because a node left the layout; null while nothing is painted.
    virtual dsp::DirtyRegion* GetDirtyRegion() { return nullptr; }
    // Paint at least this many more frames although nothing else may ask for them.
    virtual void RequestFrames(uint32_t count) = 0;

    virtual void OnDOMBuilt(Document& document) = 0;
    // A load of another document of this view is on its way; "load" then waits.
    virtual bool HasOtherLoadsPending() const { return false; }
    virtual void OnFinishLoad(Document& document) = 0;
    // Evaluates a classic script; `source_url` names it in exceptions. An exception is reported, not
    // returned.
    virtual void EvaluateScript(Document& document, std::string_view source, std::string_view source_url) = 0;
    virtual void NavigateTo(const URL& url) = 0;
};

}  // namespace qorvex::dom
