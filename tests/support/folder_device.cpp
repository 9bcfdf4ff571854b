#include "tests/support/folder_device.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <sstream>

namespace orvane::testing {

namespace {

constexpr std::wstring_view kPrefix = L"FOLDER_DEVICE_";

std::wstring Widen(const std::string& bytes) {
    const int size = static_cast<int>(bytes.size());
    std::wstring text(
        static_cast<std::size_t>(MultiByteToWideChar(CP_UTF8, 0, bytes.data(), size, nullptr, 0)), L'\0');
    MultiByteToWideChar(CP_UTF8, 0, bytes.data(), size, text.data(), static_cast<int>(text.size()));
    return text;
}

std::vector<std::wstring> SplitAt(const std::wstring& text, const std::wstring& separator) {
    std::vector<std::wstring> pieces;
    std::size_t begin = 0;
    for (std::size_t end = text.find(separator); end != std::wstring::npos;
         end = text.find(separator, begin)) {
        pieces.push_back(text.substr(begin, end - begin));
        begin = end + separator.size();
    }
    pieces.push_back(text.substr(begin));
    return pieces;
}

TraceLine ParseTraceLine(const std::wstring& text) {
    const std::vector<std::wstring> columns = SplitAt(text, L"\t");
    TraceLine line;
    if (columns.size() != 7) {
        ADD_FAILURE() << "not a line of the trace: " << columns.size() << " columns";
        return line;
    }
    line.number = std::stoull(columns[0]);
    line.thread = std::stoul(columns[1]);
    line.sessions = std::stoul(columns[2]);
    line.function = columns[3];
    if (!columns[4].empty()) {
        line.arguments = SplitAt(columns[4], L" | ");
    }
    line.result = std::stoull(columns[5], nullptr, 0);
    line.error = std::stoul(columns[6], nullptr, 0);
    return line;
}

}  // namespace

FolderDevice::FolderDevice() : library_(LoadLibraryW(L"RAPI.DLL")) {
    init_ = reinterpret_cast<rapi::CeRapiInitEx*>(
        reinterpret_cast<void*>(GetProcAddress(library_, "CeRapiInitEx")));
    uninit_ = reinterpret_cast<rapi::CeRapiUninit*>(
        reinterpret_cast<void*>(GetProcAddress(library_, "CeRapiUninit")));
    if (init_ == nullptr || uninit_ == nullptr) {
        ADD_FAILURE() << "RAPI.DLL of the folder device is not on the PATH";
        return;
    }
    ClearAll();
    Set(L"ROOT", Root());
    HaveSettingsRead();
}

FolderDevice::~FolderDevice() {
    ClearAll();
    if (init_ != nullptr && uninit_ != nullptr) {
        HaveSettingsRead();
    }
    FreeLibrary(library_);
}

void FolderDevice::ClearAll() {
    wchar_t* const block = GetEnvironmentStringsW();
    std::vector<std::wstring> names;
    for (const wchar_t* entry = block; *entry != L'\0'; entry += std::wcslen(entry) + 1) {
        const std::wstring text = entry;
        if (text.starts_with(kPrefix)) {
            names.push_back(text.substr(0, text.find(L'=')));
        }
    }
    FreeEnvironmentStringsW(block);
    for (const std::wstring& name : names) {
        SetEnvironmentVariableW(name.c_str(), nullptr);
    }
}

void FolderDevice::HaveSettingsRead() {
    CloseSessions();
    rapi::InitRecord record{sizeof(rapi::InitRecord), nullptr, S_OK};
    if (SUCCEEDED(init_(&record))) {
        uninit_();
    } else {
        ADD_FAILURE() << "the folder device does not take its settings";
    }
}

int FolderDevice::CloseSessions() {
    int closed = 0;
    while (SUCCEEDED(uninit_())) {
        ++closed;
    }
    return closed;
}

void FolderDevice::Set(const std::wstring& name, const std::wstring& value) {
    SetEnvironmentVariableW((std::wstring(kPrefix) + name).c_str(), value.c_str());
}

void FolderDevice::Clear(const std::wstring& name) {
    SetEnvironmentVariableW((std::wstring(kPrefix) + name).c_str(), nullptr);
}

void FolderDevice::SetRegistry(std::string_view text) {
    WriteTextFile(aside_ / L"registry.ini", text);
    Set(L"REGISTRY", aside_ / L"registry.ini");
}

void FolderDevice::StartTrace() {
    Set(L"TRACE", aside_ / L"trace.txt");
}

std::vector<TraceLine> FolderDevice::Trace() const {
    std::istringstream bytes(ReadTextFile(aside_ / L"trace.txt").value_or(""));
    std::vector<TraceLine> lines;
    for (std::string line; std::getline(bytes, line);) {
        lines.push_back(ParseTraceLine(Widen(line)));
    }
    return lines;
}

std::size_t FolderDevice::CallsOf(std::wstring_view function) const {
    const std::vector<TraceLine> lines = Trace();
    return static_cast<std::size_t>(std::count_if(
        lines.begin(), lines.end(), [function](const TraceLine& line) { return line.function == function; }));
}

std::wstring FolderDevice::PcPath(std::wstring_view device_path) const {
    return Root() + std::wstring(device_path);
}

}  // namespace orvane::testing
