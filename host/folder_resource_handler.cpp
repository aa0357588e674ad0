#include "folder_resource_handler.h"

#include <algorithm>
#include <cctype>
#include <cstdio>
#include <memory>

#include "file_stream_reader.h"

namespace qorvex::host {
namespace fs = std::filesystem;
namespace {

constexpr std::uint16_t kOk = 200;
constexpr std::uint16_t kNotFound = 404;
// A page has no use for a file beyond this, and a handler must not take all memory for a wrong link.
constexpr std::uintmax_t kLargestFile = std::uintmax_t{1} << 30;

struct MimeRow {
    std::string_view extension;
    const char* type;
};

constexpr MimeRow kMimeTypes[] = {
    {"html", "text/html"},     {"htm", "text/html"},       {"css", "text/css"},
    {"js", "text/javascript"}, {"mjs", "text/javascript"}, {"json", "application/json"},
    {"txt", "text/plain"},     {"xml", "application/xml"}, {"svg", "image/svg+xml"},
    {"png", "image/png"},      {"jpg", "image/jpeg"},      {"jpeg", "image/jpeg"},
    {"gif", "image/gif"},      {"webp", "image/webp"},     {"ttf", "font/ttf"},
    {"otf", "font/otf"},       {"ttc", "font/collection"}, {"otc", "font/collection"},
    {"woff", "font/woff"},     {"woff2", "font/woff2"},    {"webm", "video/webm"},
    {"mp4", "video/mp4"},      {"ogg", "audio/ogg"},       {"wav", "audio/wav"},
};

int HexDigit(char c) {
    if (c >= '0' && c <= '9') return c - '0';
    if (c >= 'a' && c <= 'f') return c - 'a' + 10;
    if (c >= 'A' && c <= 'F') return c - 'A' + 10;
    return -1;
}

std::string PercentDecode(std::string_view text) {
    std::string out;
    for (size_t i = 0; i < text.size(); ++i) {
        if (text[i] == '%' && i + 2 < text.size() && HexDigit(text[i + 1]) >= 0 &&
            HexDigit(text[i + 2]) >= 0) {
            out += static_cast<char>(HexDigit(text[i + 1]) * 16 + HexDigit(text[i + 2]));
            i += 2;
        } else {
            out += text[i];
        }
    }
    return out;
}

bool IsInside(const fs::path& root, const fs::path& path) {
    return std::mismatch(root.begin(), root.end(), path.begin(), path.end()).first == root.end();
}

}  // namespace

FolderResourceHandler::FolderResourceHandler(const fs::path& root, Report report)
    : report_(std::move(report)) {
    std::error_code fault;
    root_ = fs::weakly_canonical(root, fault);
    if (fault) root_ = root;
    // "folder/" has an empty last component, which no file below it matches.
    if (!root_.has_filename()) root_ = root_.parent_path();
}

fs::path FolderResourceHandler::Resolve(std::string_view url, std::string& why) const {
    constexpr std::string_view kScheme = "file://";
    if (url.substr(0, kScheme.size()) != kScheme) {
        why = "only file:// is served";
        return {};
    }
    url.remove_prefix(kScheme.size());
    url = url.substr(0, url.find_first_of("?#"));
    const std::string name = PercentDecode(url);
    if (name.empty() || name[0] != '/' || name.find('\0') != std::string::npos) {
        why = "not an absolute path";
        return {};
    }
    std::error_code fault;
    const fs::path path = fs::canonical(name, fault);
    if (fault) {
        why = "no such file";
        return {};
    }
    if (!IsInside(root_, path)) {
        why = "outside of " + root_.string();
        return {};
    }
    if (!fs::is_regular_file(path, fault)) {
        why = "not a file";
        return {};
    }
    if (fs::file_size(path, fault) > kLargestFile || fault) {
        why = "too large";
        return {};
    }
    return path;
}

fs::path FolderResourceHandler::Locate(std::string_view url) const {
    std::string why;
    fs::path path = Resolve(url, why);
    if (path.empty() && report_) report_("404 " + std::string(url) + ": " + why);
    return path;
}

void FolderResourceHandler::OnResourceRequest(const IAsyncResourceRequest* request,
                                              IAsyncResourceResponse* response) {
    using Status = IAsyncResourceResponse::Status;
    const fs::path path = Locate(request->GetAbsoluteURL());
    const auto close = [](std::FILE* file) { std::fclose(file); };
    const std::unique_ptr<std::FILE, decltype(close)> file(
        path.empty() ? nullptr : std::fopen(path.c_str(), "rb"), close);
    if (!file) {
        response->SetStatus(kNotFound);
        response->Finish(Status::Failure);
        return;
    }
    std::fseek(file.get(), 0, SEEK_END);
    const long size = std::max(0L, std::ftell(file.get()));
    std::rewind(file.get());
    void* space = response->GetSpace(static_cast<std::size_t>(size));
    const std::size_t read = space ? std::fread(space, 1, static_cast<std::size_t>(size), file.get()) : 0;
    response->SetHeader("Content-Type", MimeType(path.filename().string()));
    response->SetStatus(kOk);
    response->Finish(read == static_cast<std::size_t>(size) ? Status::Success : Status::Failure);
}

void FolderResourceHandler::OnResourceStreamRequest(const IAsyncResourceRequest* request,
                                                    IAsyncResourceStreamResponse* response) {
    using Status = IAsyncResourceStreamResponse::Status;
    const fs::path path = Locate(request->GetAbsoluteURL());
    ISyncStreamReader* reader = path.empty() ? nullptr : FileStreamReader::Open(path);
    if (reader) response->SetStreamReader(reader);
    response->Finish(reader ? Status::Success : Status::Failure);
}

std::string FileURL(const fs::path& path) {
    static constexpr char kHex[] = "0123456789ABCDEF";
    std::error_code fault;
    std::string url = "file://";
    for (const unsigned char c : fs::absolute(path, fault).lexically_normal().string()) {
        if (std::isalnum(c) ||
            std::string_view("/-_.~!$&'()*+,;=:@").find(static_cast<char>(c)) != std::string_view::npos) {
            url += static_cast<char>(c);
        } else {
            url += '%';
            url += kHex[c >> 4];
            url += kHex[c & 15];
        }
    }
    return url;
}

const char* MimeType(std::string_view file_name) {
    const size_t dot = file_name.rfind('.');
    if (dot != std::string_view::npos) {
        std::string extension(file_name.substr(dot + 1));
        std::transform(extension.begin(), extension.end(), extension.begin(),
                       [](unsigned char c) { return static_cast<char>(std::tolower(c)); });
        for (const MimeRow& row : kMimeTypes) {
            if (row.extension == extension) return row.type;
        }
    }
    return "application/octet-stream";
}

}  // namespace qorvex::host
