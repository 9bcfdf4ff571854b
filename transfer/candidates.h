// What the manual view lists: the files of one job folder that the other one lacks or holds an older
// version of. No windows, no threads of its own.
#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

#include "controls/sorted_list_record.h"
#include "jobs/file_types.h"
#include "selection/job_table.h"

namespace orvane {

// One entry of a list. Its first text is the name below the job folder, without "\" in front
// ("Job1\pic.jpg"); its second one is the source's last-write time in local time, "dd/mm/yyyy hh:mm:ss".
// Behind that stands what the listings knew of the file.
struct sFileDate : SortedListRecord {
    FILETIME write_time = {};
    std::uint64_t size = 0;               // Bytes.
    std::optional<FILETIME> target_time;  // Write time of the file that a copy would replace.
};

// What the two lists are made from.
struct Comparison {
    JobTable pc{};
    JobTable device{};
    FileTypes types;           // Those that are listed.
    bool overwrite_old_files;  // Whether an older file on the other side may be replaced.
    bool stopped = false;      // Ends a build.
};

// Collects into `candidates` (emptied first) the files of `source`, in its order and unticked, that would be
// copied to the side of `target`. Both are tables of `comparison`. False when the build was stopped.
bool BuildCandidates(const Comparison& comparison, const JobTable& source, const JobTable& target,
                     std::vector<sFileDate>& candidates);

// Takes out of `candidates` the first entry of each of the names, without regard to case.
void RemoveCandidates(std::vector<sFileDate>& candidates, const std::vector<std::wstring>& names);

}  // namespace orvane
