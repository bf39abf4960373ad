/**
 * Runs every test in a process of its own: the library's singletons live as long as theirs. A
 * single test runs in this process, so that a debugger finds it here.
 */

#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <memory>
#include <sstream>
#include <string>
#include <vector>

#include <fnmatch.h>
#include <gtest/gtest.h>
#include <sys/wait.h>
#include <unistd.h>

namespace {

using testing::TestInfo;
using testing::UnitTest;

/** In a test's process: what gtest prints of the test, without the frame around all tests. */
class TestLines : public testing::EmptyTestEventListener {
public:
    explicit TestLines(testing::TestEventListener* printer) : mPrinter(printer) {}

    void OnTestStart(const TestInfo& test) override { mPrinter->OnTestStart(test); }
    void OnTestPartResult(const testing::TestPartResult& result) override {
        mPrinter->OnTestPartResult(result);
    }
    void OnTestEnd(const TestInfo& test) override { mPrinter->OnTestEnd(test); }

private:
    const std::unique_ptr<testing::TestEventListener> mPrinter;
};

/** Whether one of the patterns, joined by colons, matches the name. */
bool matchesOne(const std::string& patterns, const std::string& name) {
    std::istringstream list(patterns);
    for (std::string pattern; std::getline(list, pattern, ':');) {
        if (fnmatch(pattern.c_str(), name.c_str(), 0) == 0) return true;
    }
    return false;
}

/** Whether --gtest_filter asks for the test: one of the patterns before the "-", none after it. */
bool isWanted(const std::string& name) {
    const std::string filter = GTEST_FLAG_GET(filter);
    const size_t minus = filter.find('-');
    const std::string wanted = filter.substr(0, minus);
    const std::string unwanted = minus == std::string::npos ? "" : filter.substr(minus + 1);
    return matchesOne(wanted.empty() ? "*" : wanted, name) && !matchesOne(unwanted, name);
}

std::vector<std::string> wantedTests() {
    std::vector<std::string> names;
    const UnitTest& all = *UnitTest::GetInstance();
    for (int i = 0; i < all.total_test_suite_count(); ++i) {
        const testing::TestSuite& suite = *all.GetTestSuite(i);
        for (int j = 0; j < suite.total_test_count(); ++j) {
            const std::string name = std::string(suite.name()) + '.' + suite.GetTestInfo(j)->name();
            if (isWanted(name)) names.push_back(name);
        }
    }
    return names;
}

/** Runs one test in a process of its own; whether it passed. */
bool passes(const std::string& name) {
    std::fflush(nullptr);
    const pid_t child = fork();
    if (child == 0) {
        GTEST_FLAG_SET(filter, name);
        testing::TestEventListeners& listeners = UnitTest::GetInstance()->listeners();
        listeners.Append(new TestLines(listeners.Release(listeners.default_result_printer())));
        std::exit(RUN_ALL_TESTS());
    }
    int status = 1;
    waitpid(child, &status, 0);
    if (WIFSIGNALED(status)) {
        std::printf("[  FAILED  ] %s: %s\n", name.c_str(), strsignal(WTERMSIG(status)));
    }
    return status == 0;
}

int runEachByItself(const std::vector<std::string>& names) {
    std::printf("[==========] Running %zu tests, each in a process of its own.\n", names.size());
    std::vector<std::string> failed;
    for (const std::string& name : names) {
        if (!passes(name)) failed.push_back(name);
    }
    std::printf("[==========] %zu tests ran.\n", names.size());
    std::printf("[  PASSED  ] %zu tests.\n", names.size() - failed.size());
    if (failed.empty()) return 0;
    std::printf("[  FAILED  ] %zu tests, listed below:\n", failed.size());
    for (const std::string& name : failed) std::printf("[  FAILED  ] %s\n", name.c_str());
    return 1;
}

}  // namespace

int main(int argc, char** argv) {
    testing::InitGoogleTest(&argc, argv);
    const std::vector<std::string> names = wantedTests();
    if (GTEST_FLAG_GET(list_tests) || names.size() < 2) return RUN_ALL_TESTS();
    return runEachByItself(names);
}
