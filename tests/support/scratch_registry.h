// A registry of its own for one test.
#pragma once

#include <windows.h>

namespace orvane::testing {

// As long as it lives, the current user's and the local machine's registry are two empty keys to this
// process, so that tests neither find nor leave settings in the real ones. One at a time.
class ScratchRegistry {
  public:
    ScratchRegistry();
    ~ScratchRegistry();
    ScratchRegistry(const ScratchRegistry&) = delete;
    ScratchRegistry& operator=(const ScratchRegistry&) = delete;
};

}  // namespace orvane::testing
