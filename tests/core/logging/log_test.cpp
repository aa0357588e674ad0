#include "core/logging/log.h"

#include <unistd.h>

#include <filesystem>
#include <fstream>
#include <regex>
#include <sstream>
#include <thread>

#include "core/memory/containers.h"
#include "support/scoped_library_state.h"

namespace qorvex {
namespace {

TEST(Log, PutsPiecesTogetherAndCutsLongLines) {
    test::ScopedLibraryState library;
    LogWarning("n ", -5, " ", 18446744073709551615u, " ", 2.5, " ", true, std::string(" s"), String(" q"),
               'c');
    EXPECT_EQ(library.log.Lines().back().text, "n -5 18446744073709551615 2.5 true s qc");
    LogError(std::string(2000, 'x'), "tail");
    EXPECT_EQ(library.log.Lines().back().text, std::string(1023, 'x'));
    AssertFailure("text");
    EXPECT_EQ(library.log.Lines().back().text, "Assert failure: text ");
    EXPECT_EQ(library.log.Lines().back().severity, Logging::Assert);
    qsl::function<int()> empty;
    EXPECT_EQ(empty(), 0);
    EXPECT_EQ(library.log.Lines().back().text, "Exception is thrown call to empty qsl::function");
}

TEST(Log, DropsWhatIsBelowTheThresholdAndStartsOnlyOnce) {
    test::ScopedLibraryState library(static_cast<Logging::Severity>(6));
    AssertFailure("text");
    LogError("text");
    EXPECT_TRUE(library.log.Lines().empty());
    ::testing::internal::CaptureStderr();
    EXPECT_FALSE(StartLogging(Logging::Trace, nullptr));
    EXPECT_EQ(::testing::internal::GetCapturedStderr(), "There's already an active logging scope!\n");
}

TEST(Log, ManyThreadsShareTheStreamsWithoutMixingLines) {
    test::ScopedLibraryState library;
    std::vector<std::thread> threads;
    for (int t = 0; t < 6; ++t) {
        threads.emplace_back([t] {
            for (int i = 0; i < 300; ++i)
                LogInfo(std::string(200, static_cast<char>('a' + t)), "|", i);
        });
    }
    for (std::thread& thread : threads)
        thread.join();
    const auto lines = library.log.Lines();
    EXPECT_EQ(lines.size(), 1800u);
    for (const auto& line : lines)
        EXPECT_EQ(line.text.find_first_not_of(line.text[0]), 200u);
}

TEST(Log, TheDefaultHandlerWritesFileAndStreams) {
    const auto folder = std::filesystem::temp_directory_path() / ("qorvex_log_" + std::to_string(getpid()));
    std::filesystem::create_directory(folder);
    const auto before = std::filesystem::current_path();
    std::filesystem::current_path(folder);
    test::TestAllocator allocator;
    SetAllocator(&allocator);
    ::testing::internal::CaptureStdout();
    ::testing::internal::CaptureStderr();
    StartLogging(Logging::Trace, nullptr);
    LogWarning("to out");
    LogError("to err\nE | forged\x7f");
    EndLogging();
    const std::string out = ::testing::internal::GetCapturedStdout();
    const std::string err = ::testing::internal::GetCapturedStderr();
    EXPECT_EQ(allocator.Report(), "");
    SetAllocator(nullptr);
    EXPECT_TRUE(std::regex_match(out, std::regex("\\d+ Time: \\d+ W \\| to out\n"))) << out;
    EXPECT_TRUE(std::regex_match(err, std::regex("\\d+ Time: \\d+ A \\| to err E \\| forged \n"))) << err;
    std::stringstream file;
    file << std::ifstream("qorvex_default.log").rdbuf();
    EXPECT_EQ(file.str(), out + err);
    std::filesystem::current_path(before);
    std::filesystem::remove_all(folder);
}

}  // namespace
}  // namespace qorvex
