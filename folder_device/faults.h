// The faults that strike single calls, with their counters. Any thread may ask; the counters belong to one
// configuration and begin anew with the next.
#pragma once

#include <windows.h>

#include <atomic>
#include <cstdint>
#include <memory>
#include <optional>
#include <string_view>
#include <vector>

#include "folder_device/settings.h"

namespace folder_device {

// Rules of one setting and how many calls each of them has matched.
class CountedRules {
  public:
    explicit CountedRules(const std::vector<CallRule>& rules)
        : rules_(rules), matches_(std::make_unique<std::atomic<std::uint64_t>[]>(rules.size())) {}

    // The value of the first rule that holds for this call. Every rule that matches counts the call.
    // `reaches_device` says whether rules for "*" apply; `on_path` is asked with a rule's path.
    template <class OnPath>
    std::optional<DWORD> Find(std::string_view function, bool reaches_device, OnPath on_path) {
        std::optional<DWORD> value;
        for (std::size_t i = 0; i < rules_.size(); ++i) {
            const CallRule& rule = rules_[i];
            if ((rule.function.empty() ? !reaches_device : rule.function != function) ||
                (!rule.path.empty() && !on_path(rule.path))) {
                continue;
            }
            const std::uint64_t count = ++matches_[i];
            if (!value && (rule.nth == 0 || rule.nth == count)) {
                value = rule.value;
            }
        }
        return value;
    }

  private:
    const std::vector<CallRule>& rules_;
    const std::unique_ptr<std::atomic<std::uint64_t>[]> matches_;  // One for each rule.
};

class Faults {
  public:
    // The settings must outlive it.
    explicit Faults(const Settings& settings)
        : settings_(settings),
          refuse_(settings.refuse),
          lose_reply_(settings.lose_reply),
          fall_short_(settings.fall_short) {}

    // What becomes of one call that reaches the device.
    struct Fate {
        bool vanished = false;        // The device is gone, with this call or before it.
        DWORD refusal = 0;            // The call is not carried out and fails with this.
        DWORD lost_reply = 0;         // It is carried out and then fails with this.
        DWORD byte_limit = MAXDWORD;  // The most bytes that it transfers.
    };

    // Counts the call and tells; does not return when the process is to end here.
    template <class OnPath>
    Fate OfDeviceCall(std::string_view function, OnPath on_path) {
        const std::uint64_t number = ++calls_;
        if (number == settings_.end_process) {
            TerminateProcess(GetCurrentProcess(), 99);
        }
        if (Vanished()) {
            return {.vanished = true};
        }
        const DWORD refused_here = number == settings_.fail_call ? ERROR_ACCESS_DENIED : ERROR_SUCCESS;
        const DWORD lost_here = number == settings_.lose_call ? ERROR_ACCESS_DENIED : ERROR_SUCCESS;
        return {.refusal = refuse_.Find(function, true, on_path).value_or(refused_here),
                .lost_reply = lose_reply_.Find(function, true, on_path).value_or(lost_here),
                .byte_limit = fall_short_.Find(function, true, on_path).value_or(MAXDWORD)};
    }
    // The refusal of a call that stays on the PC, by its name only; 0 when there is none.
    DWORD OfLocalCall(std::string_view function) {
        return refuse_.Find(function, false, [](const std::wstring&) { return false; }).value_or(0);
    }
    // Whether the device has vanished already.
    bool Vanished() const { return settings_.vanish != 0 && calls_ >= settings_.vanish; }

  private:
    const Settings& settings_;
    CountedRules refuse_;
    CountedRules lose_reply_;
    CountedRules fall_short_;
    std::atomic<std::uint64_t> calls_{0};
};

}  // namespace folder_device
