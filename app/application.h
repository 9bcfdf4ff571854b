// The application object.
#pragma once

namespace orvane {

// Registers the window class of the synchronization dialog: the system's dialog class under the name
// "Qel_Orvanelink". A failure is not told; without the class the dialog cannot be created.
void RegisterDialogClass();

// A translator's switch: where the registry value "Language" beside the settings names a language ("de",
// "pt-BR"; "en" is English), its texts are taken in place of those of the user's display language. Nothing
// writes it.
void FollowLanguageSwitch();

class CWendlowApp {
  public:
    // Shows the synchronization dialog and returns false when it has closed: the process then ends. Any
    // number of instances may run side by side.
    bool InitInstance();
};

}  // namespace orvane
