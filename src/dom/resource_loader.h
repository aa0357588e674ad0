// How a document asks for bytes and sheets. Implemented by resources; all calls and answers on the script
// thread. An answer never arrives inside the request that caused it, except for a sheet that is cached
// already.
#pragma once

#include <cstdint>
#include <span>
#include <string_view>

#include "core/url/url.h"

namespace qorvex::dom {

class Element;

// A finished resource. Bytes are borrowed for the time of the call that hands it over.
class ILoadedResource {
  public:
    virtual ~ILoadedResource() = default;
    // False for a transport failure and for an error status alike.
    virtual bool Succeeded() const = 0;
    virtual std::span<const uint8_t> GetData() const = 0;
    virtual const URL& GetResponseURL() const = 0;
};

class IDocumentLoader {
  public:
    virtual ~IDocumentLoader() = default;

    // Answers by Element::OnResourceLoaded(id, resource). A request that is not deferred pauses DOM building
    // with the element as owner while the document is being built, and resumes it before the answer.
    virtual uint32_t LoadResource(const URL& url, Element& element, bool deferred) = 0;
    // Answers by Element::OnStylesheetLoaded(id, sheet).
    virtual uint32_t LoadAndParseStylesheet(const URL& url, Element& element, bool deferred) = 0;
    // Parses the text of a style element on a resource thread, against the document URL. The caller has
    // paused the building; the loader resumes it with the element as owner before
    // Element::OnStylesheetLoaded.
    virtual uint32_t ParseStylesheetText(std::string_view text, Element& element) = 0;

    virtual void RequestPrefetch(const URL& url) = 0;
    virtual void RequestStylesheetPrefetch(const URL& url) = 0;

    // Anything that holds back "load": images, sheets, scripts, fonts, pending prefetches.
    virtual bool HasPendingWork() const = 0;
    virtual void StopLoading() = 0;
};

}  // namespace qorvex::dom
