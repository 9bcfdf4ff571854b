#include <windows.h>

#include "folder_device/device.h"

// Runs under the loader lock. Nothing here waits for a thread, loads a library or takes a lock that is held
// over such a thing. At the end of the process nothing is done: the system closes what is open, and threads
// that were ended while they held a lock must not be waited for.
BOOL WINAPI DllMain(HINSTANCE module, DWORD reason, LPVOID process_ends) {
    switch (reason) {
        case DLL_PROCESS_ATTACH:
            return folder_device::Device::Start(module) ? TRUE : FALSE;
        case DLL_THREAD_DETACH:
            folder_device::Device::Get().EndThread();
            break;
        case DLL_PROCESS_DETACH:
            if (process_ends == nullptr) {
                folder_device::Device::Stop();
            }
            break;
        default:
            break;
    }
    return TRUE;
}
