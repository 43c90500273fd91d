#pragma once
// SDL's audio set-up and tear-down (SDL_InitSubSystem, SDL_QuitSubSystem, opening and closing
// devices) are not safe against each other across threads. The end-of-run sound and the
// preview both hold this one lock round them.
//
// Thread contract: any thread.

#include <SDL.h>

#include <mutex>

namespace ac {

inline std::mutex& SdlAudioLock() {
    static std::mutex lock;
    return lock;
}

// Call with SdlAudioLock held. The audio subsystem brings SDL's event subsystem, which by
// default takes SIGINT and SIGTERM for a quit event nobody here reads: the program then
// ignored kill and the desktop's log-out once anything had played. Those signals stay ours.
inline bool InitSdlAudio() {
    SDL_SetHint(SDL_HINT_NO_SIGNAL_HANDLERS, "1");
    return SDL_InitSubSystem(SDL_INIT_AUDIO) == 0;
}

}  // namespace ac
