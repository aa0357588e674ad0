// Every address in the engine: an RFC 3986 URL, cleaned and parsed once, shared by count.
//
// A body is never changed after it was parsed: Merge and SetPart make new ones. So copies are one atomic
// increment, and a URL may go to any thread. Parsing opens the thread scope that it needs.
#pragma once

#include <string_view>

#include "core/memory/containers.h"

namespace qorvex {

// The pieces that SetPart replaces, as script names them.
enum class URLPart : uint32_t {
    Protocol = 0,
    Host = 1,      // host and port
    Hostname = 2,  // host alone
    Port = 3,
    Pathname = 4,
    Search = 5,  // query, with or without "?"
    Hash = 6,    // fragment, with or without "#"
};

class URL {
  public:
    URL();
    explicit URL(std::string_view text);
    URL(const URL& other);
    URL(URL&& other) noexcept;
    URL& operator=(const URL& other);
    URL& operator=(URL&& other) noexcept;
    ~URL();

    // Reads the cleaned text from `offset` on. A text that does not parse gives an invalid URL; all accessors
    // of an invalid one act as if it were empty.
    void Parse(std::string_view text, size_t offset = 0);

    [[nodiscard]] bool IsValid() const;
    [[nodiscard]] bool IsEmpty() const;
    // Without a scheme.
    [[nodiscard]] bool IsRelative() const { return GetScheme().empty(); }
    // "blob:" and something behind it.
    [[nodiscard]] bool IsBlob() const;

    [[nodiscard]] const String& GetText() const;
    [[nodiscard]] std::string_view GetScheme() const;  // without ":"
    [[nodiscard]] std::string_view GetHost() const;    // an IPv6 address with its brackets
    [[nodiscard]] std::string_view GetPort() const;
    [[nodiscard]] std::string_view GetQuery() const;     // without "?"
    [[nodiscard]] std::string_view GetFragment() const;  // without "#"
    // "/" and the segments; empty when not valid.
    [[nodiscard]] String GetPath() const;
    // Scheme (when asked for), host, and the port unless it is the scheme's own. Empty without a host.
    // Together with the path it tells whether two URLs are the same document.
    [[nodiscard]] String GetOriginLikePart(bool withScheme) const;

    // This URL resolved against `base` (RFC 3986, 5.2). One that has a scheme is returned as it is; so is any
    // that cannot be merged, with a line in the log.
    [[nodiscard]] URL Merge(const URL& base) const;
    // A URL with one piece replaced and all others letter for letter the same.
    [[nodiscard]] URL SetPart(std::string_view value, URLPart part) const;

    // Without regard to ASCII case; an invalid URL equals none.
    friend bool operator==(const URL& a, const URL& b);

  private:
    struct Body;
    explicit URL(RefPtr<Body> body);

    RefPtr<Body> body_;
};

}  // namespace qorvex
