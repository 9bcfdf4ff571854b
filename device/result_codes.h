// What device operations answer.
#pragma once

#include <cstdint>

namespace orvane {

// Results of copies and listings. The values are part of the contract between the operations and their
// callers, which compare with exactly these.
enum class DeviceResult : std::int32_t {
    kDone = 0,
    // Source not opened, no connection, target not created, a read or write failed, a listing refused.
    kFailed = -1,
    // Listings only: the cancel event was signalled before a folder was listed.
    kListingCancelled = -2,
    // The cancel event was found signalled; the partial target is gone.
    kCancelled = -10,
    // A write failed with error 112: the target's disk is full.
    kDiskFull = -999,
};

}  // namespace orvane
