#include "platform/UiQueue.h"

#include <memory>
#include <mutex>

namespace ac::UiQueue {

namespace {

std::mutex s_mutex;
// Shared so that a Post racing with SetPoster keeps the poster it picked alive for its call.
std::shared_ptr<Poster> s_poster;

std::shared_ptr<Poster> CurrentPoster() {
    std::lock_guard lock(s_mutex);
    return s_poster;
}

}  // namespace

void SetPoster(Poster poster) {
    std::lock_guard lock(s_mutex);
    s_poster = poster ? std::make_shared<Poster>(std::move(poster)) : nullptr;
}

void Post(Call call) {
    if (!call) {
        return;
    }
    if (std::shared_ptr<Poster> poster = CurrentPoster()) {
        (*poster)(std::move(call));
    } else {
        call();
    }
}

bool HasPoster() {
    return CurrentPoster() != nullptr;
}

}  // namespace ac::UiQueue
