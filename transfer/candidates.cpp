#include "transfer/candidates.h"

#include <string_view>
#include <unordered_map>

#include "platform/file_time.h"
#include "platform/text_case.h"
#include "qelutils/text_format.h"
#include "selection/copy_rules.h"

namespace orvane {

namespace {

struct NameHash {
    std::size_t operator()(std::wstring_view name) const { return HashIgnoringCase(name); }
};
struct NameEqual {
    bool operator()(std::wstring_view a, std::wstring_view b) const { return EqualIgnoringCase(a, b); }
};

std::wstring DateText(const FILETIME& time) {
    const CalendarTime local = ToLocalCalendar(time);
    return qel_text::Format(L"%02d/%02d/%04d %02d:%02d:%02d", local.day, local.month, local.year, local.hour,
                            local.minute, local.second);
}

}  // namespace

bool BuildCandidates(const Comparison& comparison, const JobTable& source, const JobTable& target,
                     std::vector<sFileDate>& candidates) {
    candidates.clear();
    const FileIndex index(target.table, target.rows);
    for (std::int32_t i = 0; i < source.rows; ++i) {
        if (comparison.stopped) {
            return false;
        }
        const auto row = static_cast<std::size_t>(i);
        const std::wstring_view name = source.table.names[row];
        const FILETIME& write_time = source.table.write_times[row];
        // The user decides by ticking: nothing is asked here.
        if (source.table.kinds[row] != kKindFile || target.IsUnknown(name) ||
            ShouldSkipCopy(comparison.overwrite_old_files, write_time, name, index, {})) {
            continue;
        }
        const std::wstring_view relative = name.substr(1);
        if (IsListedType(relative, comparison.types)) {
            sFileDate& entry = candidates.emplace_back();
            entry.first_text = relative;
            entry.second_text = DateText(write_time);
            entry.write_time = write_time;
            entry.size = source.table.sizes[row];
            entry.target_time = index.WriteTimeOf(name);
        }
    }
    return true;
}

void RemoveCandidates(std::vector<sFileDate>& candidates, const std::vector<std::wstring>& names) {
    std::unordered_map<std::wstring_view, int, NameHash, NameEqual> wanted;
    for (const std::wstring& name : names) {
        ++wanted[name];
    }
    std::vector<sFileDate> kept;
    for (sFileDate& candidate : candidates) {
        const auto found = wanted.find(candidate.first_text);
        if (found != wanted.end() && found->second > 0) {
            --found->second;
        } else {
            kept.push_back(std::move(candidate));
        }
    }
    candidates = std::move(kept);
}

}  // namespace orvane
