#include "folder_device/trace.h"

#include <atomic>

#include "folder_device/text.h"

namespace folder_device {

namespace {

std::atomic<std::uint64_t> lines_written{0};

}  // namespace

Trace::Trace(const std::wstring& path) {
    if (!path.empty()) {
        file_ = Own<OwnedHandle>(CreateFileW(path.c_str(), FILE_APPEND_DATA,
                                             FILE_SHARE_READ | FILE_SHARE_WRITE | FILE_SHARE_DELETE, nullptr,
                                             OPEN_ALWAYS, FILE_ATTRIBUTE_NORMAL, nullptr));
    }
}

void Trace::Write(const TraceEntry& entry) {
    std::wstring arguments = entry.arguments;
    for (wchar_t& c : arguments) {
        c = c < L' ' ? L'?' : c;
    }
    std::wstring line =
        L"\t" + std::to_wstring(GetCurrentThreadId()) + L"\t" + std::to_wstring(entry.sessions) + L"\t" +
        std::wstring(NameOf(entry.function)) + L"\t" + arguments + L"\t" + HexText(entry.result) + L"\t" +
        (entry.error < 0x80000000U ? std::to_wstring(entry.error) : HexText(entry.error)) + L"\n";
    const std::scoped_lock lock(mutex_);
    const std::string bytes = ToUtf8(std::to_wstring(++lines_written) + line);
    DWORD written = 0;
    WriteFile(file_.get(), bytes.data(), static_cast<DWORD>(bytes.size()), &written, nullptr);
}

}  // namespace folder_device
