#include "folder_device/call.h"

#include <algorithm>

#include "platform/text_case.h"

namespace folder_device {

ThreadErrors& Errors() {
    thread_local ThreadErrors errors;
    return errors;
}

Call::~Call() {
    if (configuration_->trace.IsOpen()) {
        Guarded(
            [this] {
                configuration_->trace.Write(
                    {function_, device_.sessions.Count(), std::move(argument_text_), result_, error_});
                return true;
            },
            false);  // The line is lost.
    }
}

DWORD Call::EnterDevice() {
    if (!device_.sessions.IsConnected()) {
        Errors().transport = HRESULT_FROM_WIN32(ERROR_NOT_CONNECTED);
        return ERROR_NOT_CONNECTED;
    }
    if (TheSettings().call_delay != 0) {
        Sleep(TheSettings().call_delay);
    }
    fate_ = configuration_->faults.OfDeviceCall(function_,
                                                [this](const std::wstring& path) { return IsOnPath(path); });
    if (fate_.vanished) {
        Sleep(TheSettings().vanish_delay);
        Errors().transport = HRESULT_FROM_WIN32(ERROR_DEVICE_NOT_CONNECTED);
        return ERROR_DEVICE_NOT_CONNECTED;
    }
    Errors().transport = S_OK;
    return fate_.refusal;
}

HRESULT Call::EnterLocal() {
    const DWORD refusal = configuration_->faults.OfLocalCall(function_);
    return refusal == ERROR_SUCCESS ? S_OK : ToHresult(refusal);
}

void Call::LeaveLocal(HRESULT result) {
    Errors().transport = SUCCEEDED(result) ? S_OK : result;
    if (FAILED(result)) {
        error_ = static_cast<DWORD>(result);
        Errors().device =
            HRESULT_FACILITY(result) == FACILITY_WIN32 ? static_cast<DWORD>(HRESULT_CODE(result)) : error_;
    }
    Return(result);
}

bool Call::IsOnPath(const std::wstring& path) const {
    return std::any_of(
        arguments_.begin(), arguments_.begin() + argument_count_, [&](const Argument& argument) {
            if (argument.kind == Argument::Kind::kText) {
                return argument.text != nullptr && orvane::EqualIgnoringCase(argument.text, path);
            }
            const auto object = argument.kind == Argument::Kind::kHandle
                                    ? device_.handles.Find(reinterpret_cast<HANDLE>(argument.number))
                                    : nullptr;
            return object != nullptr && orvane::EqualIgnoringCase(object->path, path);
        });
}

std::wstring Call::ArgumentText() const {
    std::wstring text;
    for (std::size_t i = 0; i < argument_count_; ++i) {
        const Argument& argument = arguments_[i];
        text += i == 0 ? L"" : L" | ";
        if (argument.kind == Argument::Kind::kText) {
            text += argument.text != nullptr ? argument.text : L"(null)";
            continue;
        }
        text += HexText(argument.number);
        if (argument.kind == Argument::Kind::kHandle) {
            const auto object = device_.handles.Find(reinterpret_cast<HANDLE>(argument.number));
            text += object != nullptr ? L" " + object->path : L"";
        }
    }
    return text;
}

}  // namespace folder_device
