// A small game around the engine: allocator, log, files in memory, worker threads and a software render
// target.
#pragma once

#include <fresco/scene.h>
#include <qorvex/qorvex.h>

#include <algorithm>
#include <atomic>
#include <cstdlib>
#include <cstring>
#include <functional>
#include <map>
#include <mutex>
#include <string>
#include <thread>
#include <vector>

namespace client {

// Counts what is out and checks that each block goes back under its tag.
class Allocator final : public qorvex::IAllocator {
  public:
    void* Allocate(size_t size, qorvex::MemoryTag tag) override { return Make(size, 16, tag); }
    void* Reallocate(void* block, size_t size, qorvex::MemoryTag tag) override {
        void* fresh = Make(size, 16, tag);
        if (block) {
            std::memcpy(fresh, block, std::min(size, HeaderOf(block)->size));
            Free(block, tag);
        }
        return fresh;
    }
    void Deallocate(void* block, qorvex::MemoryTag tag) override { Free(block, tag); }
    void* AlignedAllocate(size_t size, size_t alignment, qorvex::MemoryTag tag) override {
        return Make(size, alignment, tag);
    }
    void AlignedDeallocate(void* block, qorvex::MemoryTag tag) override { Free(block, tag); }
    void* AlignedReallocate(void* block, size_t size, size_t, size_t alignment,
                            qorvex::MemoryTag tag) override {
        void* fresh = Make(size, alignment, tag);
        if (block) {
            std::memcpy(fresh, block, std::min(size, HeaderOf(block)->size));
            Free(block, tag);
        }
        return fresh;
    }

    int64_t blocks() const { return blocks_; }
    int64_t peak_bytes() const { return peak_bytes_; }
    uint64_t requests() const { return requests_; }
    uint64_t wrong_tags() const { return wrong_tags_; }

  private:
    struct Header {
        size_t size;
        void* raw;
        qorvex::MemoryTag tag;
    };
    static Header* HeaderOf(void* block) {
        return reinterpret_cast<Header*>(static_cast<char*>(block) - sizeof(Header));
    }
    void* Make(size_t size, size_t alignment, qorvex::MemoryTag tag) {
        alignment = std::max<size_t>(alignment, 16);
        void* raw = std::malloc(size + sizeof(Header) + alignment);
        auto address = reinterpret_cast<uintptr_t>(raw) + sizeof(Header);
        address = (address + alignment - 1) / alignment * alignment;
        void* block = reinterpret_cast<void*>(address);
        *HeaderOf(block) = {size, raw, tag};
        ++blocks_;
        ++requests_;
        const int64_t bytes = bytes_ += static_cast<int64_t>(size);
        // Only tests that use one thread ask for it.
        if (bytes > peak_bytes_) peak_bytes_ = bytes;
        return block;
    }
    void Free(void* block, qorvex::MemoryTag tag) {
        if (!block) return;
        if (HeaderOf(block)->tag != tag) ++wrong_tags_;
        --blocks_;
        bytes_ -= static_cast<int64_t>(HeaderOf(block)->size);
        std::free(HeaderOf(block)->raw);
    }

    std::atomic<int64_t> blocks_{0};
    std::atomic<int64_t> bytes_{0};
    std::atomic<int64_t> peak_bytes_{0};
    std::atomic<uint64_t> requests_{0};
    std::atomic<uint64_t> wrong_tags_{0};
};

class Log final : public qorvex::Logging::ILogHandler {
  public:
    void WriteLog(qorvex::Logging::Severity severity, const char* text, unsigned length) override {
        const std::string line(text, length ? length - 1 : 0);
        {
            std::lock_guard<std::mutex> lock(mutex_);
            lines_.emplace_back(severity, line);
        }
        if (on_line) on_line(line);
    }
    // A page calls into the test by a line on its console.
    std::function<void(const std::string&)> on_line;
    std::vector<std::string> Lines(qorvex::Logging::Severity at_least = qorvex::Logging::Trace) const {
        std::lock_guard<std::mutex> lock(mutex_);
        std::vector<std::string> result;
        for (const auto& [severity, text] : lines_)
            if (severity >= at_least) result.push_back(text);
        return result;
    }
    std::vector<std::pair<qorvex::Logging::Severity, std::string>> LinesWithSeverity() const {
        std::lock_guard<std::mutex> lock(mutex_);
        return lines_;
    }
    bool Contains(const std::string& text) const { return Count(text) > 0; }
    size_t Count(const std::string& text) const {
        size_t count = 0;
        for (const std::string& line : Lines())
            count += line.find(text) != std::string::npos;
        return count;
    }
    void Clear() {
        std::lock_guard<std::mutex> lock(mutex_);
        lines_.clear();
    }
    // Which of the wanted lines came, in the order in which they came.
    std::vector<std::string> Matching(const std::vector<std::string>& wanted) const {
        std::vector<std::string> result;
        for (const std::string& line : Lines())
            for (const std::string& text : wanted)
                if (line == text) result.push_back(line);
        return result;
    }

  private:
    mutable std::mutex mutex_;
    std::vector<std::pair<qorvex::Logging::Severity, std::string>> lines_;
};

// Files in memory. Answers inside the request, or when the test says so.
class Files final : public qorvex::IAsyncResourceHandler {
  public:
    struct Waiting {
        unsigned id;
        std::string url;
        const qorvex::IAsyncResourceRequest* request;  // until the answer
        qorvex::IAsyncResourceResponse* response;
    };

    // "any.png" stands for all pictures that are not there.
    void Put(const std::string& url, const std::string& text) { files_[url] = text; }
    void SetDeferred(bool deferred) { deferred_ = deferred; }
    void OnResourceRequest(const qorvex::IAsyncResourceRequest* request,
                           qorvex::IAsyncResourceResponse* response) override {
        std::unique_lock<std::mutex> lock(mutex_);
        requests.push_back(request->GetAbsoluteURL());
        if (deferred_) {
            waiting.push_back({request->GetId(), request->GetAbsoluteURL(), request, response});
            return;
        }
        const std::string url = request->GetAbsoluteURL();
        lock.unlock();
        Answer(url, response);
    }
    void OnAbortResourceRequest(unsigned id) override {
        std::lock_guard<std::mutex> lock(mutex_);
        aborted.push_back(id);
    }
    void Answer(const std::string& url, qorvex::IAsyncResourceResponse* response) {
        using Status = qorvex::IAsyncResourceResponse::Status;
        auto found = files_.find(url);
        if (found == files_.end() && url.ends_with(".png")) found = files_.find("any.png");
        if (found == files_.end()) {
            response->SetStatus(404);
            response->Finish(Status::Failure);
            return;
        }
        std::copy(found->second.begin(), found->second.end(),
                  static_cast<char*>(response->GetSpace(found->second.size())));
        response->SetStatus(200);
        response->Finish(Status::Success);
    }
    // Answers everything that waits, on the calling thread.
    size_t AnswerAll() {
        std::vector<Waiting> all;
        {
            std::lock_guard<std::mutex> lock(mutex_);
            all.swap(waiting);
        }
        for (const Waiting& entry : all)
            Answer(entry.url, entry.response);
        return all.size();
    }

    std::vector<std::string> requests;
    std::vector<unsigned> aborted;
    std::vector<Waiting> waiting;

  private:
    std::mutex mutex_;
    std::map<std::string, std::string> files_;
    bool deferred_ = false;
};

class Listener final : public qorvex::IViewListener {
  public:
    bool OnNavigateTo(const char* url) override { return Note(std::string("navigate ") + url), allow; }
    void OnScriptContextCreated() override { Note("context"); }
    void OnDOMBuilt() override { Note("built"); }
    void OnLoadFailed(const char* url, const char* error) override {
        Note(std::string("failed ") + url + ": " + error);
    }
    void OnFinishLoad(const char* url) override { Note(std::string("loaded ") + url); }
    qorvex::InterceptRequestStatus OnResourceRequestIntercepted(const char* url) override {
        return std::string(url).find("forbidden") == std::string::npos
                   ? qorvex::InterceptRequestStatus::Allow
                   : qorvex::InterceptRequestStatus::Refuse;
    }
    bool allow = true;
    std::vector<std::string> events;

  private:
    void Note(std::string event) { events.push_back(std::move(event)); }
};

struct Options {
    bool dedicated_layout = false;
    int layout_threads = 0;
    int resource_threads = 0;
    bool requests_on_workers = false;
    bool complex_selectors = true;
    unsigned width = 64;
    unsigned height = 48;
    unsigned severity = qorvex::Logging::Trace;
    bool pools = true;
    bool wait_for_renderer = false;
    const char* switches = nullptr;
    // Nothing is pruned that a test does not prune.
    qorvex::CacheLimits image_limits{1000, 1u << 30, 1000, 1u << 30};
    // Puts a handler of the test's own in front of the files.
    std::function<qorvex::IAsyncResourceHandler*(Files&)> wrap_handler;
    // Called before each frame.
    std::function<void()> on_frame;
};

// One library, system, view and renderer; the test's thread is main and render thread.
class Client {
  public:
    explicit Client(Options options = {});
    ~Client();

    // One frame; serves the engine's work on this thread when there are no workers.
    void Frame(double dt = 16);
    // A frame in two parts.
    void Advance(double dt = 16);
    void Paint();
    // Frames until the page has loaded and nothing is open; gives up after many.
    void RunUntilLoaded();
    void Load(const std::string& html, const std::string& url = "coui://page/index.html");
    void ServeResources();
    // RGBA of a pixel over white.
    uint32_t Pixel(unsigned x, unsigned y) const;
    // A new renderer, and an empty target for it.
    void MakeRenderer();
    void DestroyView();

    Allocator allocator;
    Log log;
    Files files;
    Listener listener;
    Options options;
    qorvex::Library* library = nullptr;
    qorvex::System* system = nullptr;
    qorvex::View* view = nullptr;
    qorvex::SystemRenderer* system_renderer = nullptr;
    qorvex::ViewRenderer* renderer = nullptr;
    std::vector<uint32_t> pixels;
    std::vector<uint32_t> completed;  // frame ids, in order
    uint32_t last_frame = 0;
    double time = 0;

  private:
    static void OnFrameComplete(void* self, uint32_t view, uint32_t frame, uint32_t);

    std::vector<std::thread> workers_;
    mutable std::mutex mutex_;
    fresco::CpuRenderTarget target_;
};

}  // namespace client
