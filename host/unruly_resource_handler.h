#pragma once

#include <qorvex/resource_handler.h>

#include <cstddef>
#include <cstdint>
#include <map>
#include <memory>
#include <mutex>
#include <string>
#include <vector>

namespace qorvex::host {

// How badly an UnrulyResourceHandler behaves: for each fault, in how many of a hundred requests it happens.
// Each request meets at most one fault; every request is delayed.
struct Manners {
    std::uint32_t longest_delay = 30;  // steps that an answer may take
    std::uint32_t fail = 5;            // failure, with status 404 or none
    std::uint32_t cut = 5;             // only the first part of the bytes
    std::uint32_t pieces = 15;         // byte by byte, with progress in between
    std::uint32_t too_long = 5;        // asks for more space than it fills, then for less
    std::uint32_t twice = 5;           // finished again, once at once and once some steps later
    std::uint32_t abrupt = 5;          // inside the request, without a delay
    std::uint32_t never = 0;           // not at all, until AnswerAll or the end
    bool from_other_thread = true;     // half of the answers come from a thread of the handler's own
    bool in_turn = true;               // one after the other; false: both threads answer at once, and a run
                                       // is no longer the same run each time
};

// Stands between the engine and a well-behaved handler and spoils what that one answers: for tests, and to
// see one's own loading screens, placeholders and error pages.
//
// What happens to a request follows from the seed, its URL and how often that URL was asked for, so a run
// with the same seed is the same run. Answers come in Step, in an order that the seed picks; a client calls
// it once a frame, before Advance.
//
// For one system. Requests come on any thread, Step and AnswerAll on one. The inner handler must answer each
// request exactly once, as the interface asks it to. Both handlers must live until every request was answered
// or the library has been uninitialised; nothing is answered after that.
class UnrulyResourceHandler final : public IAsyncResourceHandler {
  public:
    UnrulyResourceHandler(IAsyncResourceHandler& inner, std::uint64_t seed, Manners manners = {});
    // What was never answered stays so.
    ~UnrulyResourceHandler() override;
    UnrulyResourceHandler(const UnrulyResourceHandler&) = delete;
    UnrulyResourceHandler& operator=(const UnrulyResourceHandler&) = delete;

    // Requests for this URL are delayed, but meet no fault: a page that fails shows nothing to look at.
    void Spare(const std::string& url);

    // Answers what is due, and returns the number; when answers come in turn, they are given by then.
    std::size_t Step();
    // Answers everything that waits, what should never be answered too.
    std::size_t AnswerAll();
    // Returns when no answer is being given: before Library::Uninitialize, when answers do not come in turn.
    void WaitUntilIdle();
    // Answers that wait for a later step; without those that never come.
    [[nodiscard]] std::size_t Waiting() const;

    void OnResourceRequest(const IAsyncResourceRequest* request, IAsyncResourceResponse* response) override;
    void OnResourceStreamRequest(const IAsyncResourceRequest* request,
                                 IAsyncResourceStreamResponse* response) override;
    // By the seed: passed over, or answered at once with a failure, inside this call.
    void OnAbortResourceRequest(unsigned id) override;

  private:
    enum class Fault { None, Fail, Cut, Pieces, TooLong, Twice, Abrupt, Never };
    struct Answer;
    class Recorder;
    class StreamRecorder;
    class Helper;

    [[nodiscard]] std::unique_ptr<Answer> Judge(const IAsyncResourceRequest& request);
    void Receive(std::unique_ptr<Answer> answer);
    std::size_t Give(std::vector<std::unique_ptr<Answer>> answers, bool wait);
    void Deliver(Answer& answer);
    static void WriteAnswer(Answer& answer);
    void FinishAgainLater(const Answer& answer);

    IAsyncResourceHandler& inner_;
    const std::uint64_t seed_;
    const Manners manners_;

    mutable std::mutex mutex_;
    std::uint64_t step_ = 0;
    std::vector<std::string> spared_;
    std::map<std::string, std::uint64_t> asked_;
    std::vector<std::unique_ptr<Answer>> waiting_;
    std::unique_ptr<Helper> helper_;
};

}  // namespace qorvex::host
