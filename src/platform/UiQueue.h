#pragma once
// The one road from a worker thread to the windows: Post hands a call to the UI thread and
// returns at once. The program installs a poster on wx's CallAfter at start; until one is
// installed (window-free tests), calls run on the posting thread.
//
// A posted call may arrive after its target window is gone: capture a wxWeakRef (or another
// liveness token) when posting and check it on arrival.
//
// Thread contract: Post from any thread; SetPoster once at start on the UI thread.

#include <functional>

namespace ac::UiQueue {

using Call = std::function<void()>;
using Poster = std::function<void(Call)>;

void SetPoster(Poster poster);
void Post(Call call);
// True once a poster is installed (the program, window tests).
bool HasPoster();

}  // namespace ac::UiQueue
