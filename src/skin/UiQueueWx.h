#pragma once
// Installs the UI queue's poster on wx: posted calls run in the event loop of the UI thread.
//
// Thread contract: call once on the UI thread after the wxApp exists.

namespace ac {

void InstallWxUiQueue();

}  // namespace ac
