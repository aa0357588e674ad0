#include "headless.h"

#include <qorvex/debug_interface.h>
#include <qorvex/view.h>

#include <cstdio>
#include <fstream>
#include <iterator>
#include <string>

#include "event_file.h"
#include "output_files.h"
#include "session.h"

namespace player {
namespace {

constexpr std::uint32_t kMostFrames = 300;
// Frames in a row without a change after which a loaded page counts as quiet.
constexpr std::uint32_t kQuietFrames = 2;

int Fail(const std::string& line) {
    std::fprintf(stderr, "qorvex-player: %s\n", line.c_str());
    return kExitBadInput;
}

bool ReadFile(const std::string& file, std::string& out) {
    std::ifstream stream(file, std::ios::binary);
    out.assign(std::istreambuf_iterator<char>(stream), {});
    return stream.good() || stream.eof();
}

// One headless run over a session.
class Run {
  public:
    Run(Session& session, const Options& options) : session_(session), options_(options) {}

    [[nodiscard]] bool Prepare(std::string& error) {
        if (!options_.script_file.empty() && !ReadFile(options_.script_file, script_)) {
            error = "cannot read " + options_.script_file;
            return false;
        }
        if (!options_.events_file.empty() && !events_.Load(options_.events_file, error)) return false;
        return session_.LoadPage(error);
    }

    void Frames() {
        const std::uint32_t most = options_.frames.value_or(kMostFrames);
        std::uint32_t quiet = 0;
        while (count_ < most && session_.LoadError().empty()) {
            // A capture shows the whole view, so the last frame redraws it; its number must be known ahead.
            if (options_.frames && count_ + 1 == most && !options_.capture_file.empty()) AskForCapture();
            const bool changed = OneFrame();
            const bool busy = changed || !session_.IsLoaded() || !script_done_ || events_.Remaining() ||
                              session_.HoldsAnswersBack();
            quiet = busy ? 0 : quiet + 1;
            if (!options_.frames && quiet >= kQuietFrames) break;
        }
        if (!options_.capture_file.empty()) FinishCapture();
    }

    [[nodiscard]] bool Write(std::string& error) {
        return WriteOutputs(session_, options_, capture_, stats_, error);
    }

  private:
    bool OneFrame() {
        session_.Settle();
        if (session_.IsLoaded() && !script_done_) {
            if (!script_.empty()) session_.View()->ExecuteScript(script_.c_str());
            script_done_ = true;
        }
        events_.Feed(count_, *session_.View());
        const std::uint32_t id = session_.RunFrame(++count_ * options_.frame_milliseconds);
        qorvex::FrameStats stats;
        if (!options_.stats_file.empty() && session_.Stats()->GetFrame(session_.View(), id, &stats)) {
            stats_.push_back(stats);
        }
        return session_.Debug()->HasChanged(session_.View());
    }

    void AskForCapture() {
        session_.View()->ContinuousRepaint(true);
        session_.View()->CaptureNextFrame(
            [](void* out, const qorvex::FrameCapture& capture) {
                static_cast<std::string*>(out)->assign(static_cast<const char*>(capture.GetData()),
                                                       capture.GetSize());
            },
            &capture_);
        asked_ = true;
    }

    // The capture arrives in the frame after the captured one.
    void FinishCapture() {
        if (!asked_) {
            AskForCapture();
            OneFrame();
        }
        session_.View()->ContinuousRepaint(false);
        OneFrame();
    }

    Session& session_;
    const Options& options_;
    EventFile events_;
    std::string script_;
    std::string capture_;
    std::vector<qorvex::FrameStats> stats_;
    std::uint32_t count_ = 0;
    bool script_done_ = false;
    bool asked_ = false;
};

}  // namespace

int RunHeadless(const Options& options) {
    std::string error;
    const std::unique_ptr<Session> session = Session::Create(options, true, error);
    if (!session) return Fail(error);
    Run run(*session, options);
    if (!run.Prepare(error)) return Fail(error);
    run.Frames();
    if (!session->LoadError().empty()) return Fail(session->LoadError());
    if (!run.Write(error)) return Fail(error);
    return options.strict && session->SawErrors() ? kExitStrict : kExitFine;
}

}  // namespace player
