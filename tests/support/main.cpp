#include <gtest/gtest.h>
#include <windows.h>

#include <commctrl.h>

#include <cstdio>

#include "qelutils/xlate.h"

// The entry point of every test program, which has the common controls at hand. A test that hangs, a dialog
// that nobody closes for instance, ends the program after a minute with exit code 3, so that it cannot hold
// up the whole run. Texts are English, whatever language the user has.

namespace {

class Watchdog : public ::testing::EmptyTestEventListener {
  public:
    void OnTestStart(const ::testing::TestInfo& /*test*/) override {
        CreateTimerQueueTimer(&timer_, nullptr, End, nullptr, 60'000, 0, WT_EXECUTEONLYONCE);
    }
    void OnTestEnd(const ::testing::TestInfo& /*test*/) override {
        DeleteTimerQueueTimer(nullptr, timer_, nullptr);
    }

  private:
    static void CALLBACK End(void* /*context*/, BOOLEAN /*fired*/) {
        std::fputs("The test hangs: ending the test program\n", stderr);
        std::fflush(stderr);
        TerminateProcess(GetCurrentProcess(), 3);
    }

    HANDLE timer_ = nullptr;
};

}  // namespace

int main(int argc, char** argv) {
    const INITCOMMONCONTROLSEX controls = {sizeof(controls), ICC_WIN95_CLASSES};
    InitCommonControlsEx(&controls);
    qel_text::SetCatalogLanguage(MAKELANGID(LANG_ENGLISH, SUBLANG_ENGLISH_US));
    ::testing::InitGoogleTest(&argc, argv);
    ::testing::UnitTest::GetInstance()->listeners().Append(new Watchdog);
    return RUN_ALL_TESTS();
}
