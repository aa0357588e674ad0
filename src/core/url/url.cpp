#include "core/url/url.h"

#include <uriparser/Uri.h>

#include <cstring>

#include "core/logging/log.h"
#include "core/memory/thread_scope.h"
#include "core/url/url_escape.h"

namespace qorvex {

namespace {

std::string_view View(const UriTextRangeA& range) {
    if (range.first == nullptr || range.afterLast == nullptr) return {};
    return {range.first, static_cast<size_t>(range.afterLast - range.first)};
}

// The uriparser library frees without a size and reallocates by copying: a plain block with its size in front
// serves all of its five operations.
void* Allocate(UriMemoryManager*, size_t size) {
    auto* block =
        static_cast<size_t*>(GetAllocator()->Allocate(size + alignof(std::max_align_t), MemoryTag::General));
    *block = size;
    return reinterpret_cast<char*>(block) + alignof(std::max_align_t);
}

size_t* BlockOf(void* memory) {
    return reinterpret_cast<size_t*>(static_cast<char*>(memory) - alignof(std::max_align_t));
}

void Free(UriMemoryManager*, void* memory) {
    if (memory != nullptr) GetAllocator()->Deallocate(BlockOf(memory), MemoryTag::General);
}

void* AllocateZeroed(UriMemoryManager* manager, size_t count, size_t size) {
    void* memory = Allocate(manager, count * size);
    std::memset(memory, 0, count * size);
    return memory;
}

void* Reallocate(UriMemoryManager* manager, void* memory, size_t size) {
    void* grown = Allocate(manager, size);
    if (memory != nullptr) {
        std::memcpy(grown, memory, std::min(*BlockOf(memory), size));
        Free(manager, memory);
    }
    return grown;
}

void* ReallocateArray(UriMemoryManager* manager, void* memory, size_t count, size_t size) {
    return Reallocate(manager, memory, count * size);
}

UriMemoryManager g_memory = {Allocate, AllocateZeroed, Reallocate, ReallocateArray, Free, nullptr};

char LowerCase(char c) {
    return c >= 'A' && c <= 'Z' ? static_cast<char>(c + ('a' - 'A')) : c;
}

bool EqualsIgnoringCase(std::string_view a, std::string_view b) {
    return a.size() == b.size() && std::equal(a.begin(), a.end(), b.begin(),
                                              [](char x, char y) { return LowerCase(x) == LowerCase(y); });
}

std::string_view DefaultPort(std::string_view scheme) {
    struct Row {
        std::string_view scheme, port;
    };
    static constexpr Row kRows[] = {{"ftp", "21"}, {"http", "80"}, {"https", "443"}};
    for (const Row& row : kRows) {
        if (EqualsIgnoringCase(scheme, row.scheme)) return row.port;
    }
    return {};
}

constexpr std::string_view kBlobPrefix = "blob:";

}  // namespace

// `parsed` points into `text`, which is why a body is made in place and never copied.
struct URL::Body : AtomicRefCounted<URL::Body, MemoryTag::General> {
    Body() = default;
    Body(const Body&) = delete;
    ~Body() {
        if (valid) uriFreeUriMembersMmA(&parsed, &g_memory);
    }

    void ParseText(size_t offset) {
        const char* error = nullptr;
        valid = uriParseSingleUriExMmA(&parsed, text.data() + offset, text.data() + text.size(), &error,
                                       &g_memory) == URI_SUCCESS;
        if (!valid) {
            LogDebug("Unable to parse URI ", text.view());
            return;
        }
        is_blob =
            text.size() > kBlobPrefix.size() && text.view().substr(0, kBlobPrefix.size()) == kBlobPrefix;
    }

    UriUriA parsed = {};
    String text;
    bool valid = false;
    bool is_blob = false;
};

URL::URL(RefPtr<Body> body) : body_(std::move(body)) {}
URL::URL() = default;
URL::URL(std::string_view text) {
    Parse(text);
}
URL::URL(const URL& other) = default;
URL::URL(URL&& other) noexcept = default;
URL& URL::operator=(const URL& other) = default;
URL& URL::operator=(URL&& other) noexcept = default;
URL::~URL() = default;

void URL::Parse(std::string_view text, size_t offset) {
    const ThreadScope scope;
    const TempMark mark;
    body_ = MakeRef<Body>();
    if (text.size() <= offset) return;
    TempString cleaned;
    EscapeForURL(text, cleaned);
    if (cleaned.size() <= offset) return;
    body_->text = cleaned.view();
    body_->ParseText(offset);
}

bool URL::IsValid() const {
    return body_ && body_->valid;
}
bool URL::IsEmpty() const {
    return !IsValid() || body_->text.empty();
}
bool URL::IsBlob() const {
    return IsValid() && body_->is_blob;
}

const String& URL::GetText() const {
    // Constructed once; an empty string holds no memory, so it may outlive the library.
    static const String kEmpty;
    return IsValid() ? body_->text : kEmpty;
}

std::string_view URL::GetScheme() const {
    return IsValid() ? View(body_->parsed.scheme) : std::string_view();
}

std::string_view URL::GetHost() const {
    if (!IsValid()) return {};
    std::string_view host = View(body_->parsed.hostText);
    // The parser leaves the brackets of an IP literal out of the range.
    if (!host.empty() && host.data() > body_->text.data() && host.data()[-1] == '[') {
        host = {host.data() - 1, host.size() + 2};
    }
    return host;
}

std::string_view URL::GetPort() const {
    return IsValid() ? View(body_->parsed.portText) : std::string_view();
}
std::string_view URL::GetQuery() const {
    return IsValid() ? View(body_->parsed.query) : std::string_view();
}
std::string_view URL::GetFragment() const {
    return IsValid() ? View(body_->parsed.fragment) : std::string_view();
}

String URL::GetPath() const {
    String path;
    if (!IsValid()) return path;
    for (const UriPathSegmentA* segment = body_->parsed.pathHead; segment != nullptr;
         segment = segment->next) {
        path.push_back('/');
        path.append(View(segment->text));
    }
    if (path.empty()) path.push_back('/');
    return path;
}

String URL::GetOriginLikePart(bool withScheme) const {
    String part;
    const std::string_view scheme = GetScheme();
    const std::string_view host = GetHost();
    if ((withScheme && scheme.empty()) || host.empty()) return part;
    if (withScheme) {
        part.append(scheme);
        part.append("://");
    }
    part.append(host);
    const std::string_view port = GetPort();
    if (port.empty()) return part;
    if (scheme.empty()) {
        AssertFailure("Invalid scheme/port when checking for default port");
    } else if (port != DefaultPort(scheme)) {
        part.push_back(':');
        part.append(port);
    }
    return part;
}

URL URL::Merge(const URL& base) const {
    if (!IsValid() || !base.IsValid()) {
        LogError("Trying to merge URLs that are not valid!");
        return *this;
    }
    if (!IsRelative()) return *this;
    UriUriA merged = {};
    if (uriAddBaseUriExMmA(&merged, &body_->parsed, &base.body_->parsed, URI_RESOLVE_STRICTLY, &g_memory) !=
        URI_SUCCESS) {
        uriFreeUriMembersMmA(&merged, &g_memory);
        LogError("Unable to merge urls: ", GetText().view(), " ", base.GetText().view());
        return *this;
    }
    int size = 0;
    RefPtr<Body> body = MakeRef<Body>();
    bool recomposed = uriToStringCharsRequiredA(&merged, &size) == URI_SUCCESS && size >= 0;
    if (recomposed) {
        body->text.resize(static_cast<size_t>(size) + 1, '\0');
        int written = 0;  // counts the terminator
        recomposed =
            uriToStringA(body->text.data(), &merged, size + 1, &written) == URI_SUCCESS && written > 0;
        body->text.resize(recomposed ? static_cast<size_t>(written) - 1 : 0, '\0');
    }
    uriFreeUriMembersMmA(&merged, &g_memory);
    if (!recomposed) {
        LogDebug("Unable to recompose URI!");
        LogError("Unable to copy to string merged URL!");
        return *this;
    }
    body->ParseText(0);
    return URL(std::move(body));
}

URL URL::SetPart(std::string_view value, URLPart part) const {
    if (!IsValid()) {
        LogError("Trying to change part of URL that is not valid!");
        return {};
    }
    if (part == URLPart::Protocol && value.empty()) {
        AssertFailure("Cannot unset protocol in URL!");
        return *this;
    }
    const ThreadScope scope;
    const TempMark mark;
    const UriUriA& parsed = body_->parsed;
    TempString text;
    const auto piece = [&](URLPart which, std::string_view own) { return part == which ? value : own; };

    std::string_view scheme = piece(URLPart::Protocol, GetScheme());
    while (!scheme.empty() && scheme.back() == ':')
        scheme.remove_suffix(1);
    if (!scheme.empty()) {
        text.append(scheme);
        text.push_back(':');
    }
    const std::string_view host = part == URLPart::Host ? value : piece(URLPart::Hostname, GetHost());
    const std::string_view port =
        part == URLPart::Host ? std::string_view() : piece(URLPart::Port, GetPort());
    // "file:///path" has an empty host that must stay.
    if (!host.empty() || parsed.hostText.first != nullptr) {
        text.append("//");
        if (const std::string_view user = View(parsed.userInfo); !user.empty()) {
            text.append(user);
            text.push_back('@');
        }
        text.append(host);
        if (!port.empty()) {
            text.push_back(':');
            text.append(port);
        }
    }
    const String own_path = GetPath();
    const bool has_path = parsed.pathHead != nullptr || part == URLPart::Pathname;
    std::string_view path = has_path ? piece(URLPart::Pathname, own_path.view()) : std::string_view();
    // A path without a host may be relative, and then has no slash in front.
    if (part != URLPart::Pathname && parsed.hostText.first == nullptr && !parsed.absolutePath &&
        !path.empty()) {
        path.remove_prefix(1);
    }
    if (!path.empty() && path[0] != '/' && !host.empty()) text.push_back('/');
    text.append(path);
    const auto tail = [&](URLPart which, std::string_view own, char mark_character) {
        std::string_view piece_text = piece(which, own);
        if (!piece_text.empty() && piece_text[0] == mark_character) piece_text.remove_prefix(1);
        if (piece_text.empty()) return;
        text.push_back(mark_character);
        text.append(piece_text);
    };
    tail(URLPart::Search, GetQuery(), '?');
    tail(URLPart::Hash, GetFragment(), '#');
    return URL(text.view());
}

bool operator==(const URL& a, const URL& b) {
    return a.IsValid() && b.IsValid() && EqualsIgnoringCase(a.body_->text.view(), b.body_->text.view());
}

}  // namespace qorvex
