#include "tests/support/folder_device.h"

#include <gtest/gtest.h>

#include <filesystem>
#include <sstream>

namespace orvane::testing {

namespace {

constexpr std::wstring_view kPrefix = L"FOLDER_DEVICE_";

std::vector<std::wstring> SplitAt(const std::wstring& text, const std::wstring& separator) {
    std::vector<std::wstring> pieces;
    std::size_t begin = 0;
    for (std::size_t end = 0; end != std::wstring::npos; begin = end + separator.size()) {
        end = text.find(separator, begin);
        pieces.push_back(text.substr(begin, end - begin));
    }
    return pieces;
}

TraceLine ParseTraceLine(const std::wstring& text) {
    const std::vector<std::wstring> columns = SplitAt(text, L"\t");
    if (columns.size() != 7) {
        ADD_FAILURE() << "not a line of the trace: " << columns.size() << " columns";
        return {};
    }
    return {.number = std::stoull(columns[0]),
            .thread = std::stoul(columns[1]),
            .sessions = std::stoul(columns[2]),
            .function = columns[3],
            .arguments = columns[4].empty() ? std::vector<std::wstring>() : SplitAt(columns[4], L" | "),
            .error = std::stoul(columns[6], nullptr, 0)};
}

}  // namespace

FolderDevice::FolderDevice() : library_(LoadLibraryW(L"RAPI.DLL")) {
    init_ = reinterpret_cast<rapi::CeRapiInitEx*>(
        reinterpret_cast<void*>(GetProcAddress(library_, "CeRapiInitEx")));
    uninit_ = reinterpret_cast<rapi::CeRapiUninit*>(
        reinterpret_cast<void*>(GetProcAddress(library_, "CeRapiUninit")));
    if (init_ == nullptr) {
        ADD_FAILURE() << "RAPI.DLL of the folder device is not on the PATH";
        return;
    }
    Set(L"ROOT", Root());
    HaveSettingsRead();
}

FolderDevice::~FolderDevice() {
    for (const std::wstring& name : set_) {
        Clear(name);
    }
    if (init_ != nullptr) {
        HaveSettingsRead();
    }
    FreeLibrary(library_);
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
    set_.insert(name);
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
    const std::string utf8 = ReadTextFile(aside_ / L"trace.txt").value_or("");
    std::wistringstream text(std::filesystem::path(std::u8string(utf8.begin(), utf8.end())).wstring());
    std::vector<TraceLine> lines;
    for (std::wstring line; std::getline(text, line);) {
        lines.push_back(ParseTraceLine(line));
    }
    return lines;
}

std::size_t FolderDevice::CallsOf(std::wstring_view function) const {
    std::vector<TraceLine> lines = Trace();
    return std::erase_if(lines, [function](const TraceLine& line) { return line.function == function; });
}

std::wstring FolderDevice::PcPath(std::wstring_view device_path) const {
    return Root() + std::wstring(device_path);
}

}  // namespace orvane::testing
