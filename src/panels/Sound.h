#pragma once
// The end-of-run sound: a WAV file played once in the background. Each sound has a thread of its
// own that opens the audio device, plays and closes it again, so a sound never waits for
// another and the caller never waits at all. Without a sound device (SDL's dummy driver, or
// none) nothing is heard and nothing fails; a missing or damaged file does nothing.
//
// Thread contract: any thread. The threads are joined by WaitForSounds, by StopSounds and at the
// program's end.

#include <string>

namespace ac {

void PlaySoundAsync(const std::string& path);
// Waits until every sound started so far has played out.
void WaitForSounds();
// Cuts the sounds short and waits for their threads.
void StopSounds();

}  // namespace ac
