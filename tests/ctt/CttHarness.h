#pragma once
// Shared by the ctt suites: run the built tool the way the program does, probe what it wrote,
// and check that a run left nothing half-written behind.

#include <gtest/gtest.h>

#include <filesystem>
#include <string>
#include <vector>

#include "medialist/MediaProbe.h"
#include "support/AudioFixtures.h"
#include "support/RunTool.h"
#include "support/TempDir.h"

namespace ac::test {

inline std::string CttPath() { return std::string(AC_BIN_DIR) + "/ctt"; }

// "-relk -y -i IN" + options + OUT, as the program lays it out.
inline ToolResult RunCtt(const std::string& input, const std::vector<std::string>& options,
                         const std::string& output, bool overwrite = true) {
    std::vector<std::string> args = {"-relk"};
    if (overwrite) {
        args.push_back("-y");
    }
    args.push_back("-i");
    args.push_back(input);
    args.insert(args.end(), options.begin(), options.end());
    args.push_back(output);
    return RunTool(CttPath(), args);
}

inline double DurationOf(const MediaFileInfo& info) {
    return info.hours * 3600.0 + info.minutes * 60.0 + info.seconds + info.microseconds * 1e-6;
}

inline MediaFileInfo Probe(const std::string& path) {
    MediaFileInfo info;
    EXPECT_EQ(ProbeFile(path, info), 1) << path;
    return info;
}

// No output and no temporary file may survive a failed run.
inline void ExpectNothingLeft(const std::string& dir, const std::string& output) {
    EXPECT_FALSE(std::filesystem::exists(output)) << output;
    for (const auto& entry : std::filesystem::directory_iterator(dir)) {
        EXPECT_EQ(entry.path().string().find(".part"), std::string::npos) << entry.path();
    }
}

inline std::vector<double> TimeLines(const std::string& out) {
    std::vector<double> times;
    size_t at = 0;
    while ((at = out.find("|Time>>> ", at)) != std::string::npos) {
        at += 9;
        times.push_back(std::atof(out.c_str() + at));
    }
    return times;
}

}  // namespace ac::test
