// ctt: the conversion tool. One input (a media file, a cue track "SHEET|N" or a CD track
// "DRIVE/TrackNN.cda") to one audio file, with progress and errors as the lines the program
// reads (Report.h). Exit code 0 only when the output file is complete and in place.

#include <signal.h>
#include <sys/stat.h>
#include <time.h>
#include <unistd.h>

#include <atomic>
#include <cerrno>
#include <cmath>
#include <cstring>
#include <memory>
#include <string>
#include <vector>

#include "AudioSink.h"
#include "CttOptions.h"
#include "Report.h"
#include "Sources.h"
#include "medialist/CueSheet.h"

namespace {

using namespace ac::ctt;

volatile sig_atomic_t s_stopRequested = 0;

void OnStopSignal(int) { s_stopRequested = 1; }

void InstallSignalHandlers() {
    // A reader that went away must not kill us mid-write: EPIPE is handled where it happens.
    signal(SIGPIPE, SIG_IGN);
    struct sigaction action {};
    action.sa_handler = OnStopSignal;
    sigemptyset(&action.sa_mask);
    sigaction(SIGTERM, &action, nullptr);
    sigaction(SIGINT, &action, nullptr);
    sigaction(SIGHUP, &action, nullptr);
}

double NowSeconds() {
    timespec ts{};
    clock_gettime(CLOCK_MONOTONIC, &ts);
    return static_cast<double>(ts.tv_sec) + static_cast<double>(ts.tv_nsec) * 1e-9;
}

std::unique_ptr<AudioSource> OpenSource(const CttOptions& options, std::string& error) {
    struct stat st {};
    const std::string& input = options.input;
    if (::stat(input.c_str(), &st) != 0) {
        if (auto cue = ac::SplitCueTrackPath(input)) {
            ac::CueTrackSpan span;
            if (!ac::ResolveCueTrack(cue->sheet, cue->track, span, error)) {
                return nullptr;
            }
            const std::int64_t startUs = span.startFrame * 1000000 / ac::kCueFramesPerSecond;
            const std::int64_t endUs =
                span.endFrame < 0 ? -1 : span.endFrame * 1000000 / ac::kCueFramesPerSecond;
            auto source = OpenFileSource(span.audioPath, startUs, endUs, error);
            if (source) {
                // The sheet's titles stand in for tags the command line does not give.
                auto& tags = const_cast<std::map<std::string, std::string>&>(source->Tags());
                if (!span.title.empty()) tags["title"] = span.title;
                if (!span.performer.empty()) tags["author"] = span.performer;
                if (!span.album.empty()) tags["album"] = span.album;
            }
            return source;
        }
        if (IsCdaPath(input)) {
            return OpenCdSource(input, error);
        }
        error = "the input \"" + input + "\" does not exist";
        return nullptr;
    }
    if (S_ISDIR(st.st_mode)) {
        error = "the input \"" + input + "\" is a folder";
        return nullptr;
    }
    return OpenFileSource(input, 0, -1, error);
}

bool OutputFolderUsable(const std::string& output, std::string& error) {
    std::string dir = output.substr(0, output.find_last_of('/') == std::string::npos
                                           ? 0
                                           : output.find_last_of('/'));
    if (output.find('/') == std::string::npos) {
        dir = ".";
    } else if (dir.empty()) {
        dir = "/";
    }
    struct stat st {};
    if (::stat(dir.c_str(), &st) != 0 || !S_ISDIR(st.st_mode)) {
        error = "the output folder \"" + dir + "\" does not exist";
        return false;
    }
    if (::access(dir.c_str(), W_OK) != 0) {
        error = "the output folder \"" + dir + "\" cannot be written";
        return false;
    }
    return true;
}

// The pump: source frames cut to the window [ss, ss + t) of the span, into the sink, with a
// time line at least every quarter second of wall time.
int Convert(const CttOptions& options) {
    std::string error;
    struct stat existing {};
    if (::stat(options.output.c_str(), &existing) == 0) {
        if (!options.overwrite) {
            ReportError("the output \"" + options.output + "\" exists (give -y to replace it)");
            return 1;
        }
        if (S_ISDIR(existing.st_mode)) {
            ReportError("the output \"" + options.output + "\" is a folder");
            return 1;
        }
    }
    if (!OutputFolderUsable(options.output, error)) {
        ReportError(error);
        return 1;
    }
    std::unique_ptr<AudioSource> source = OpenSource(options, error);
    if (!source) {
        ReportError(error);
        return 1;
    }
    std::map<std::string, std::string> tags = source->Tags();
    for (const auto& [key, value] : options.tags) {
        if (!value.empty()) {
            tags[key] = value;
        }
    }
    AudioSink sink;
    InputFormat format{source->SampleFormat(), source->SampleRate(), &source->Layout()};
    if (!sink.Open(options, format, tags, error)) {
        ReportError(error);
        return 1;
    }

    const int rate = source->SampleRate();
    auto toSamples = [rate](std::int64_t us) {
        return static_cast<std::int64_t>(std::llround(static_cast<double>(us) * rate / 1e6));
    };
    // A negative input offset drops the first part; a positive one plays silence first.
    const std::int64_t windowStart = toSamples(options.startUs) +
                                     (options.tsOffsetUs < 0 ? toSamples(-options.tsOffsetUs) : 0);
    std::int64_t windowEnd = options.durationUs > 0 ? windowStart + toSamples(options.durationUs)
                                                    : INT64_MAX;
    if (options.tsOffsetUs > 0 && !sink.WriteSilence(toSamples(options.tsOffsetUs), error)) {
        ReportError(error);
        return 1;
    }
    if (windowStart > 0) {
        source->SeekTo(windowStart);
    }

    AVFrame* frame = av_frame_alloc();
    std::int64_t done = 0;
    std::int64_t spanReached = 0;
    double lastReport = NowSeconds();
    int result = 0;
    bool sourceEnded = false;
    for (;;) {
        if (s_stopRequested || OutputGone()) {
            result = 1;
            break;
        }
        std::int64_t position = 0;
        const int got = source->Next(frame, position);
        if (got < 0) {
            ReportError(source->Error());
            result = 1;
            break;
        }
        if (got == 0) {
            sourceEnded = true;
            break;
        }
        const std::int64_t frameEnd = position + frame->nb_samples;
        spanReached = std::max(spanReached, frameEnd);
        if (position >= windowEnd) {
            av_frame_unref(frame);
            break;
        }
        if (frameEnd > windowStart) {
            const std::int64_t from = std::max(position, windowStart);
            const std::int64_t to = std::min(frameEnd, windowEnd);
            if (!sink.Write(frame, static_cast<int>(from - position), static_cast<int>(to - from), error)) {
                ReportError(error);
                av_frame_unref(frame);
                result = 1;
                break;
            }
            done = to - windowStart;
        }
        av_frame_unref(frame);
        const double now = NowSeconds();
        if (now - lastReport >= 0.2) {
            ReportTime(static_cast<double>(done) / rate);
            lastReport = now;
        }
    }
    av_frame_free(&frame);
    if (result == 0 && done == 0 && windowStart > 0) {
        ReportError("the start time lies beyond the end of the input");
        result = 1;
    }
    if (result == 0 && sourceEnded && options.durationUs == 0 && !source->CheckComplete(spanReached)) {
        ReportError(source->Error());
        result = 1;
    }
    if (result == 0 && !sink.Commit(error)) {
        ReportError(error);
        result = 1;
    }
    if (result == 0) {
        ReportTime(static_cast<double>(done) / rate);
        // The rip driver fails a track whose stdout holds "Error" anywhere: keep paths out.
        ReportStatus("Done.");
    } else if (s_stopRequested) {
        ReportError("stopped");
    }
    return OutputGone() ? 1 : result;
}

}  // namespace

int main(int argc, char** argv) {
    InstallSignalHandlers();
    InstallLibraryLogHooks();
    std::vector<std::string> words(argv + 1, argv + argc);
    ParseResult parsed = ParseArguments(words);
    if (!parsed.options) {
        ReportError(parsed.error);
        return 2;
    }
    const CttOptions& options = *parsed.options;
    if (!options.ignored.empty()) {
        std::string names;
        for (const std::string& name : options.ignored) {
            names += (names.empty() ? "-" : ", -") + name;
        }
        ReportWarning("video options have no effect on an audio output: " + names);
    }
    return Convert(options);
}
