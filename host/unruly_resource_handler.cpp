#include "unruly_resource_handler.h"

#include <qorvex/file_system.h>

#include <algorithm>
#include <condition_variable>
#include <cstring>
#include <deque>
#include <functional>
#include <optional>
#include <thread>
#include <utility>

namespace qorvex::host {
namespace {

using Status = IAsyncResourceResponse::Status;

constexpr std::uint64_t kNever = ~std::uint64_t{0};
constexpr std::uint16_t kNotFound = 404;
// Steps until an answer that is given twice is given again.
constexpr std::uint64_t kSecondTime = 3;
// Larger bodies come in this many pieces, smaller ones byte by byte.
constexpr std::size_t kMostPieces = 4096;

std::uint64_t Mix(std::uint64_t value) {
    value = (value ^ (value >> 30)) * 0xBF58476D1CE4E5B9u;
    value = (value ^ (value >> 27)) * 0x94D049BB133111EBu;
    return value ^ (value >> 31);
}

std::uint64_t Mix(std::uint64_t value, const std::string& text) {
    for (const char c : text)
        value = (value ^ static_cast<unsigned char>(c)) * 0x100000001B3u;
    return Mix(value);
}

}  // namespace

// One answer on its way from the inner handler to the engine.
struct UnrulyResourceHandler::Answer {
    ~Answer() {
        if (reader) reader->Close();
    }

    IAsyncResourceResponse* response = nullptr;      // one of the two
    IAsyncResourceStreamResponse* stream = nullptr;  //
    unsigned id = 0;
    Fault fault = Fault::None;
    std::uint64_t due = 0;     // steps; first the delay, then the number of the step
    std::uint64_t random = 0;  // for what else is left to chance
    bool from_other_thread = false;
    bool again = false;  // only to finish once more

    std::vector<char> bytes;
    std::optional<UserImageData> image;
    std::optional<std::uint16_t> status;
    std::optional<std::string> url;
    std::vector<std::pair<std::string, std::string>> headers;
    ISyncStreamReader* reader = nullptr;
    Status outcome = Status::Failure;
};

// What the inner handler writes its answer to.
class UnrulyResourceHandler::Recorder final : public IAsyncResourceResponse {
  public:
    Recorder(UnrulyResourceHandler& owner, std::unique_ptr<Answer> answer)
        : owner_(owner), answer_(std::move(answer)) {}

    void* GetSpace(std::size_t size) override {
        answer_->bytes.resize(size);
        return answer_->bytes.data();
    }
    void RecieveUserImage(const UserImageData& image) override { answer_->image = image; }
    void SignalDataReceived() override {}
    void SetStatus(std::uint16_t status) override { answer_->status = status; }
    void SetResponseURL(const char* url) override { answer_->url = url; }
    void SetHeader(const char* name, const char* value) override {
        answer_->headers.emplace_back(name, value);
    }
    void Finish(Status status) override {
        answer_->outcome = status;
        owner_.Receive(std::move(answer_));
        delete this;
    }

  private:
    ~Recorder() override = default;
    UnrulyResourceHandler& owner_;
    std::unique_ptr<Answer> answer_;
};

class UnrulyResourceHandler::StreamRecorder final : public IAsyncResourceStreamResponse {
  public:
    StreamRecorder(UnrulyResourceHandler& owner, std::unique_ptr<Answer> answer)
        : owner_(owner), answer_(std::move(answer)) {}

    void SetStreamReader(ISyncStreamReader* reader) override { answer_->reader = reader; }
    void Finish(Status status) override {
        answer_->outcome = status;
        owner_.Receive(std::move(answer_));
        delete this;
    }

  private:
    ~StreamRecorder() override = default;
    UnrulyResourceHandler& owner_;
    std::unique_ptr<Answer> answer_;
};

// The thread of the handler's own.
class UnrulyResourceHandler::Helper {
  public:
    Helper() : thread_([this] { Serve(); }) {}
    ~Helper() {
        {
            const std::lock_guard lock(mutex_);
            stopping_ = true;
        }
        changed_.notify_all();
        thread_.join();
    }

    void Run(std::function<void()> job) {
        {
            const std::lock_guard lock(mutex_);
            jobs_.push_back(std::move(job));
        }
        changed_.notify_all();
    }
    void Wait() {
        std::unique_lock lock(mutex_);
        changed_.wait(lock, [this] { return jobs_.empty() && !busy_; });
    }

  private:
    void Serve() {
        std::unique_lock lock(mutex_);
        for (;;) {
            changed_.wait(lock, [this] { return stopping_ || !jobs_.empty(); });
            if (jobs_.empty()) return;
            const std::function<void()> job = std::move(jobs_.front());
            jobs_.pop_front();
            busy_ = true;
            lock.unlock();
            job();
            lock.lock();
            busy_ = false;
            changed_.notify_all();
        }
    }

    std::mutex mutex_;
    std::condition_variable changed_;
    std::deque<std::function<void()>> jobs_;
    bool busy_ = false;
    bool stopping_ = false;
    std::thread thread_;
};

UnrulyResourceHandler::UnrulyResourceHandler(IAsyncResourceHandler& inner, std::uint64_t seed,
                                             Manners manners)
    : inner_(inner), seed_(seed), manners_(manners) {
    if (manners_.from_other_thread) helper_ = std::make_unique<Helper>();
}

UnrulyResourceHandler::~UnrulyResourceHandler() = default;

void UnrulyResourceHandler::Spare(const std::string& url) {
    const std::lock_guard lock(mutex_);
    spared_.push_back(url);
}

std::unique_ptr<UnrulyResourceHandler::Answer> UnrulyResourceHandler::Judge(
    const IAsyncResourceRequest& request) {
    const struct {
        Fault fault;
        std::uint32_t percent;
    } rows[] = {
        {Fault::Fail, manners_.fail},        {Fault::Cut, manners_.cut},     {Fault::Pieces, manners_.pieces},
        {Fault::TooLong, manners_.too_long}, {Fault::Twice, manners_.twice}, {Fault::Abrupt, manners_.abrupt},
        {Fault::Never, manners_.never},
    };
    auto answer = std::make_unique<Answer>();
    answer->id = request.GetId();
    const std::string url = request.GetAbsoluteURL();
    const std::lock_guard lock(mutex_);
    const std::uint64_t random = Mix(Mix(seed_ + asked_[url]++), url);
    std::uint64_t draw = random % 100;
    for (const auto& row : rows) {
        if (draw < row.percent) {
            answer->fault = row.fault;
            break;
        }
        draw -= row.percent;
    }
    if (std::find(spared_.begin(), spared_.end(), url) != spared_.end()) answer->fault = Fault::None;
    answer->random = Mix(random);
    answer->due = 1 + answer->random % (manners_.longest_delay + std::uint64_t{1});
    answer->from_other_thread = helper_ && (answer->random >> 32) % 2;
    return answer;
}

void UnrulyResourceHandler::OnResourceRequest(const IAsyncResourceRequest* request,
                                              IAsyncResourceResponse* response) {
    std::unique_ptr<Answer> answer = Judge(*request);
    answer->response = response;
    inner_.OnResourceRequest(request, new Recorder(*this, std::move(answer)));
}

void UnrulyResourceHandler::OnResourceStreamRequest(const IAsyncResourceRequest* request,
                                                    IAsyncResourceStreamResponse* response) {
    std::unique_ptr<Answer> answer = Judge(*request);
    answer->stream = response;
    inner_.OnResourceStreamRequest(request, new StreamRecorder(*this, std::move(answer)));
}

void UnrulyResourceHandler::Receive(std::unique_ptr<Answer> answer) {
    if (answer->fault == Fault::Abrupt) return Deliver(*answer);
    const std::lock_guard lock(mutex_);
    answer->due = answer->fault == Fault::Never ? kNever : step_ + answer->due;
    waiting_.push_back(std::move(answer));
}

void UnrulyResourceHandler::OnAbortResourceRequest(unsigned id) {
    inner_.OnAbortResourceRequest(id);
    std::unique_ptr<Answer> answer;
    {
        const std::lock_guard lock(mutex_);
        const auto found = std::find_if(waiting_.begin(), waiting_.end(), [id](const auto& entry) {
            return entry->id == id && entry->response && !entry->again;
        });
        if (found == waiting_.end() || (*found)->random % 2) return;
        answer = std::move(*found);
        waiting_.erase(found);
    }
    answer->response->Finish(Status::Failure);
}

std::size_t UnrulyResourceHandler::Waiting() const {
    const std::lock_guard lock(mutex_);
    return static_cast<std::size_t>(std::count_if(waiting_.begin(), waiting_.end(),
                                                  [](const auto& entry) { return entry->due != kNever; }));
}

std::size_t UnrulyResourceHandler::Step() {
    std::vector<std::unique_ptr<Answer>> due;
    {
        const std::lock_guard lock(mutex_);
        ++step_;
        const auto first = std::partition(waiting_.begin(), waiting_.end(),
                                          [this](const auto& entry) { return entry->due > step_; });
        std::move(first, waiting_.end(), std::back_inserter(due));
        waiting_.erase(first, waiting_.end());
    }
    return Give(std::move(due), manners_.in_turn);
}

std::size_t UnrulyResourceHandler::AnswerAll() {
    std::size_t count = 0;
    for (;;) {
        std::vector<std::unique_ptr<Answer>> all;
        {
            const std::lock_guard lock(mutex_);
            all.swap(waiting_);
        }
        if (all.empty()) break;
        count += Give(std::move(all), true);
    }
    WaitUntilIdle();
    return count;
}

void UnrulyResourceHandler::WaitUntilIdle() {
    if (helper_) helper_->Wait();
}

std::size_t UnrulyResourceHandler::Give(std::vector<std::unique_ptr<Answer>> answers, bool wait) {
    // By chance, and not in the order of arrival, which threads decide.
    std::sort(answers.begin(), answers.end(), [](const auto& a, const auto& b) {
        return std::pair(a->random, a->id) < std::pair(b->random, b->id);
    });
    for (std::unique_ptr<Answer>& answer : answers) {
        if (!answer->from_other_thread) {
            Deliver(*answer);
            continue;
        }
        helper_->Run([this, shared = std::shared_ptr<Answer>(std::move(answer))] { Deliver(*shared); });
        if (wait) helper_->Wait();
    }
    return answers.size();
}

void UnrulyResourceHandler::FinishAgainLater(const Answer& answer) {
    auto again = std::make_unique<Answer>();
    again->response = answer.response;
    again->stream = answer.stream;
    again->id = answer.id;
    again->random = answer.random;
    again->again = true;
    const std::lock_guard lock(mutex_);
    again->due = step_ + kSecondTime;
    waiting_.push_back(std::move(again));
}

void UnrulyResourceHandler::Deliver(Answer& answer) {
    if (answer.fault == Fault::Fail) answer.outcome = Status::Failure;
    if (answer.stream) {
        if (answer.reader) answer.stream->SetStreamReader(std::exchange(answer.reader, nullptr));
        answer.stream->Finish(answer.outcome);
        if (answer.fault == Fault::Twice) answer.stream->Finish(Status::Success);
    } else if (answer.again) {
        answer.response->Finish(Status::Success);
    } else {
        WriteAnswer(answer);
        answer.response->Finish(answer.outcome);
        if (answer.fault == Fault::Twice) answer.response->Finish(Status::Failure);
    }
    if (answer.fault == Fault::Twice) FinishAgainLater(answer);
}

void UnrulyResourceHandler::WriteAnswer(Answer& answer) {
    IAsyncResourceResponse& response = *answer.response;
    if (answer.fault == Fault::Fail) {
        if (answer.random % 2) response.SetStatus(kNotFound);
        return;
    }
    for (const auto& [name, value] : answer.headers)
        response.SetHeader(name.c_str(), value.c_str());
    if (answer.url) response.SetResponseURL(answer.url->c_str());
    if (answer.status) response.SetStatus(*answer.status);
    if (answer.image) return response.RecieveUserImage(*answer.image);

    std::vector<char>& bytes = answer.bytes;
    if (answer.fault == Fault::Cut) {
        bytes.resize(bytes.size() * (answer.random % 90) / 100);
        if (answer.random % 3 == 0) answer.outcome = Status::Failure;
    }
    if (answer.fault == Fault::TooLong) {
        response.GetSpace(~std::size_t{0});
        response.GetSpace(2 * bytes.size() + 100);
    }
    const std::size_t piece =
        answer.fault == Fault::Pieces ? std::max<std::size_t>(1, bytes.size() / kMostPieces) : bytes.size();
    for (std::size_t at = 0; at < bytes.size(); at += piece) {
        const std::size_t size = std::min(piece, bytes.size() - at);
        void* space = response.GetSpace(at + size);
        if (!space) return;
        std::memcpy(static_cast<char*>(space) + at, bytes.data() + at, size);
        if (size < bytes.size()) response.SignalDataReceived();
    }
    if (bytes.empty()) response.GetSpace(0);
}

}  // namespace qorvex::host
