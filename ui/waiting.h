// What the user sees and can do while something keeps the user-interface thread busy.
#pragma once

#include <windows.h>

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

// Forgets the calling thread's clicks and keys that came while it was busy: they were meant for what was
// shown then, and would now press a button once more or tick another entry.
void DropPendingInput();

}  // namespace orvane::ui
