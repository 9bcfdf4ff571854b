// Measures one case of the program: see cases.h. ./bench runs all of them and makes the table.
#include <windows.h>

#include <cstdio>
#include <cstdlib>
#include <string>
#include <vector>

#include "benchmark/cases.h"

namespace {

bool Run(const std::vector<std::wstring>& arguments) {
    const auto number = [&](std::size_t index) { return std::stoi(arguments[index]); };
    const std::wstring& name = arguments.at(0);
    if (name == L"decision" && arguments.size() == 5) {
        return orvane::bench::RunDecision(number(1), number(2), number(3), number(4));
    }
    if (name == L"sync" && arguments.size() == 3) {
        return orvane::bench::RunSync(arguments[1], number(2) != 0);
    }
    if (name == L"listing" && arguments.size() == 1) {
        return orvane::bench::RunListing();
    }
    if (name == L"lists" && arguments.size() == 2) {
        return orvane::bench::RunLists(arguments[1]);
    }
    if (name == L"start" && arguments.size() == 2) {
        return orvane::bench::RunStart(arguments[1]);
    }
    std::fputs(
        "decision COUNT PER_FOLDER SECONDS STRIDE | sync PC_FOLDER BACKUPS | listing | lists PC_FOLDER | "
        "start PROGRAM\n",
        stderr);
    return false;
}

}  // namespace

int wmain(int count, wchar_t** values) {
    const std::vector<std::wstring> arguments(values + 1, values + count);
    return !arguments.empty() && Run(arguments) ? 0 : 1;
}
