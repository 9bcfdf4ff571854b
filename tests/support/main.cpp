#include <gtest/gtest.h>
#include <windows.h>

#include <atomic>
#include <cstdio>
#include <string>
#include <thread>

// The entry point of every test program. A test that hangs, a dialog that nobody closes for instance,
// ends the program after a minute with exit code 3, so that it cannot hold up the whole run.

namespace {

class Watchdog : public ::testing::EmptyTestEventListener {
  public:
    explicit Watchdog(int seconds) : limit_ms_(static_cast<ULONGLONG>(seconds) * 1000) {
        // The thread ends with the process, which is why it is never joined.
        std::thread([this] { Watch(); }).detach();
    }

    void OnTestStart(const ::testing::TestInfo& test) override {
        name_ = std::string(test.test_suite_name()) + "." + test.name();
        deadline_ = GetTickCount64() + limit_ms_;
    }
    void OnTestEnd(const ::testing::TestInfo&) override { deadline_ = 0; }

  private:
    void Watch() {
        for (;;) {
            Sleep(200);
            const ULONGLONG deadline = deadline_;
            if (deadline != 0 && GetTickCount64() > deadline) {
                std::fprintf(stderr, "%s hangs: ending the test program\n", name_.c_str());
                std::fflush(stderr);
                TerminateProcess(GetCurrentProcess(), 3);
            }
        }
    }

    ULONGLONG limit_ms_;
    std::string name_;
    std::atomic<ULONGLONG> deadline_{0};
};

}  // namespace

int main(int argc, char** argv) {
    ::testing::InitGoogleTest(&argc, argv);
    ::testing::UnitTest::GetInstance()->listeners().Append(new Watchdog(60));
    return RUN_ALL_TESTS();
}
