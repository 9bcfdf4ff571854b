// What the user sees and can do while something keeps the user-interface thread busy.
#pragma once

#include <windows.h>

#include <functional>

namespace orvane::ui {

// Shows the hour glass from construction to destruction, then the arrow. The program's dialogs keep it while
// they handle messages meanwhile.
class WaitCursor {
  public:
    WaitCursor();
    ~WaitCursor();
    WaitCursor(const WaitCursor&) = delete;
    WaitCursor& operator=(const WaitCursor&) = delete;

    // Whether the calling thread shows it.
    static bool IsShown();
};

// Waits until `worker`, a thread or another handle that can be waited for, is signalled. Meanwhile the
// calling thread's windows paint, move with their timers and answer what is sent to them; keys, clicks and
// commands are dropped, also those that are still pending at the end. The close box and Escape signal
// `stop_event` (null: they are only remembered); the worker is to end then as soon as it can, and is waited
// for all the same. False when the user asked to close: the caller then ends its dialog.
//
// Messages that are sent, by a screen reader's "press" for instance, reach the dialog at any time: it has to
// know that it waits.
bool WaitAndPaint(HANDLE worker, HANDLE stop_event);

// How RunAndPaint ended: the work was done; it ended because the user asked to close; it could not be done
// because the memory is used up.
enum class Waited { kDone, kClosed, kFailed };

// Runs `work` on a thread of its own, with a stack of that many bytes at its start, and waits for it as
// WaitAndPaint does. `stop_event`, a manual-reset event, is reset first. The work may use what belongs to the
// calling thread, which does nothing with it meanwhile, but no windows.
Waited RunAndPaint(const std::function<void()>& work, HANDLE stop_event, SIZE_T stack_bytes);

// Forgets the calling thread's clicks and keys that came while it was busy: they were meant for what was
// shown then, and would now press a button once more or tick another entry.
void DropPendingInput();

}  // namespace orvane::ui
