#include <windows.h>

#include "app/application.h"

int WINAPI wWinMain(HINSTANCE /*instance*/, HINSTANCE /*previous*/, PWSTR /*command_line*/,
                    int /*show_command*/) {
    orvane::CWendlowApp application;
    return application.InitInstance() ? 1 : 0;
}
