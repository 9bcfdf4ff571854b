// The content of one file, from an open source to an open target.
#pragma once

#include <windows.h>

#include <cstdint>

#include "copy/copy_context.h"
#include "device/result_codes.h"

namespace orvane {

// Copies from where the source's handle stands to its end. The device's side reads and writes in chunks of
// 8192 bytes, one call for each unless it does less than was asked; a source of full chunks only ends with a
// chunk of 0 bytes there. The PC's side reads and writes in larger pieces. The cancel event is polled before
// the first chunk and after every full one; the caller has looked at it.
//
// `size`, in bytes, tells a source that has ended from a read that fell short: one that ends before it is
// kFailed, one that has grown is copied as far as it goes. kDone when all has been handed to the target's
// system, kCancelled, kDiskFull when a write failed with error 112, kFailed for all else. Neither handle is
// closed.
DeviceResult CopyContent(const CopyContext& context, HANDLE source, HANDLE target, std::uint64_t size);

}  // namespace orvane
