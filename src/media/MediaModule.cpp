// The media module's entry: the table of the real functions. Built into libac-media.so only.
#include "media/MediaModule.h"

#include "medialist/MediaProbe.h"
#include "panels/Sound.h"

extern "C" {
#include <libavutil/log.h>
}

namespace {

const ac::media::ModuleApi kApi = {
    .version = ac::media::kModuleVersion,
    .infoSize = sizeof(ac::MediaFileInfo),
    .probeFile = &ac::ProbeFile,
    .demuxerExtensions = &ac::DemuxerExtensions,
    .putenv = &avp_putenv,
    .initSize = &avp_init_size,
    .init = &avp_init,
    .open = &avp_open,
    .getLength = &avp_get_length,
    .run = &avp_run,
    .getCurPos = &avp_get_cur_pos,
    .setCurPos = &avp_set_cur_pos,
    .togglePause = &avp_toggle_pause,
    .stop = &avp_stop,
    .deinit = &avp_deinit,
    .setPictureSink = &ac::player::SetPictureSink,
    .windowText = &ac::player::WindowText,
    .isRunning = &ac::player::IsRunning,
    .clockIsAudioDevice = &ac::player::ClockIsAudioDevice,
    .peekQueuedSound = &ac::player::PeekQueuedSound,
    .playSoundAsync = &ac::PlaySoundAsync,
    .waitForSounds = &ac::WaitForSounds,
    .stopSounds = &ac::StopSounds,
};

}  // namespace

extern "C" __attribute__((visibility("default"))) const ac::media::ModuleApi* ac_media_module() {
    // Probing runs in the program's process; a row's reason says in words why a file cannot be
    // read, so FFmpeg's own complaints stay off the terminal the program was started from.
    av_log_set_level(AV_LOG_QUIET);
    return &kApi;
}
