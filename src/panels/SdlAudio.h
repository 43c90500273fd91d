#pragma once
// SDL's audio set-up and tear-down (SDL_InitSubSystem, SDL_QuitSubSystem, opening and closing
// devices) are not safe against each other across threads. The end-of-run sound and the
// preview both hold this one lock round them.
//
// Thread contract: any thread.

#include <mutex>

namespace ac {

inline std::mutex& SdlAudioLock() {
    static std::mutex lock;
    return lock;
}

}  // namespace ac
