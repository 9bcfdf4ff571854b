// The refused calls and the vanishing device, with their counters. Any thread may ask; the counters belong
// to one configuration and begin anew with the next.
#pragma once

#include <windows.h>

#include <atomic>
#include <cstdint>
#include <memory>
#include <vector>

#include "folder_device/functions.h"
#include "folder_device/settings.h"

namespace folder_device {

class Faults {
  public:
    explicit Faults(const Settings& settings)
        : rules_(settings.refuse),
          matches_(std::make_unique<std::atomic<std::uint64_t>[]>(rules_.size())),
          vanish_at_(settings.vanish_at) {}

    // Counts one call that reaches the device; true when the device has vanished with or before it.
    bool CountCall() { return vanish_at_ != 0 && ++calls_ >= vanish_at_; }
    // Whether the device has vanished already.
    bool Vanished() const { return vanish_at_ != 0 && calls_ >= vanish_at_; }

    // The error of the first rule that refuses this call, 0 when none does. Every rule that matches counts
    // the call. `reaches_device` says whether rules for "*" apply; `on_path` is asked with a rule's path.
    template <class OnPath>
    DWORD Refusal(Function function, bool reaches_device, OnPath on_path) {
        DWORD error = ERROR_SUCCESS;
        for (std::size_t i = 0; i < rules_.size(); ++i) {
            const RefuseRule& rule = rules_[i];
            if (rule.function ? *rule.function != function : !reaches_device) {
                continue;
            }
            if (!rule.path.empty() && !on_path(rule.path)) {
                continue;
            }
            const std::uint64_t count = ++matches_[i];
            if (error == ERROR_SUCCESS && (rule.nth == 0 || rule.nth == count)) {
                error = rule.error;
            }
        }
        return error;
    }

  private:
    const std::vector<RefuseRule> rules_;
    const std::unique_ptr<std::atomic<std::uint64_t>[]> matches_;  // One for each rule.
    const std::uint64_t vanish_at_;
    std::atomic<std::uint64_t> calls_{0};
};

}  // namespace folder_device
