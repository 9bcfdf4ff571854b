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
    // The thread ends with the process, which is why it is never joined.
    Watchdog() { std::thread(&Watchdog::Watch, this).detach(); }

    void OnTestStart(const ::testing::TestInfo& test) override {
        name_ = std::string(test.test_suite_name()) + "." + test.name();
        deadline_ = GetTickCount64() + 60'000;
    }
    void OnTestEnd(const ::testing::TestInfo&) override { deadline_ = 0; }

  private:
    void Watch() {
        for (ULONGLONG deadline = 0; deadline == 0 || GetTickCount64() <= deadline; deadline = deadline_) {
            Sleep(200);
        }
        std::fprintf(stderr, "%s hangs: ending the test program\n", name_.c_str());
        std::fflush(stderr);
        TerminateProcess(GetCurrentProcess(), 3);
    }

    std::string name_;
    std::atomic<ULONGLONG> deadline_{0};
};

}  // namespace

int main(int argc, char** argv) {
    ::testing::InitGoogleTest(&argc, argv);
    ::testing::UnitTest::GetInstance()->listeners().Append(new Watchdog);
    return RUN_ALL_TESTS();
}
