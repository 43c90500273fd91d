#include "skin/UiQueueWx.h"

#include "platform/UiQueue.h"

#include <wx/app.h>

namespace ac {

void InstallWxUiQueue() {
    UiQueue::SetPoster([](UiQueue::Call call) {
        // After the application object is gone nothing can run the call; dropping it is right.
        if (wxTheApp != nullptr) {
            wxTheApp->CallAfter(std::move(call));
        }
    });
}

}  // namespace ac
