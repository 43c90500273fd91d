// The profiles shipped in data/profile: each loads, offers only values its codec takes, and
// (once ctt is built) turns a real WAV file into a file of its format.
#include "profile/ParameterSet.h"

#include <gtest/gtest.h>

#include <sys/wait.h>
#include <unistd.h>

#include <algorithm>
#include <cmath>
#include <filesystem>

#include "../support/ProfileFiles.h"
#include "convert/CommandLine.h"
#include "convert/OutputNaming.h"
#include "platform/CommandLine.h"
#include "profile/TextUtil.h"

namespace {

namespace fs = std::filesystem;

std::vector<std::string> ShippedProfiles() {
    std::vector<std::string> names;
    for (const auto& entry : fs::directory_iterator(AC_SOURCE_DIR "/data/profile")) {
        if (entry.path().extension() == ".pf") names.push_back(entry.path().filename().string());
    }
    std::sort(names.begin(), names.end());
    return names;
}

// One second of a 440 Hz tone, 44.1 kHz 16-bit stereo.
std::string ToneWav() {
    constexpr std::uint32_t kRate = 44100;
    constexpr std::uint32_t kFrames = kRate;
    std::string data;
    for (std::uint32_t i = 0; i < kFrames; ++i) {
        const auto sample = static_cast<std::int16_t>(8000 * std::sin(2 * M_PI * 440 * i / kRate));
        for (int channel = 0; channel < 2; ++channel) {
            data += static_cast<char>(sample & 0xFF);
            data += static_cast<char>((sample >> 8) & 0xFF);
        }
    }
    auto le = [](std::uint32_t value, int bytes) {
        std::string out;
        for (int i = 0; i < bytes; ++i) out += static_cast<char>((value >> (8 * i)) & 0xFF);
        return out;
    };
    return "RIFF" + le(36 + data.size(), 4) + "WAVEfmt " + le(16, 4) + le(1, 2) + le(2, 2) + le(kRate, 4) +
           le(kRate * 4, 4) + le(4, 2) + le(16, 2) + "data" + le(data.size(), 4) + data;
}

// Runs the program with the words; answers its exit code, -1 if it did not end normally.
int RunTool(const std::string& program, const std::vector<std::string>& words, const std::string& log) {
    const pid_t child = ::fork();
    if (child == 0) {
        std::FILE* out = std::freopen(log.c_str(), "w", stdout);
        if (out != nullptr) ::dup2(::fileno(stdout), 2);
        std::vector<char*> argv{const_cast<char*>(program.c_str())};
        for (const std::string& word : words) argv.push_back(const_cast<char*>(word.c_str()));
        argv.push_back(nullptr);
        ::execv(program.c_str(), argv.data());
        ::_exit(127);
    }
    int status = 0;
    ::waitpid(child, &status, 0);
    return WIFEXITED(status) ? WEXITSTATUS(status) : -1;
}

// Whether the first bytes are those of the container the extension promises: ctt must not write
// a file of another format under the right name.
bool StartsLikeItsFormat(const std::string& extension, const std::string& head) {
    auto at = [&](std::size_t offset, std::string_view magic) { return head.compare(offset, magic.size(), magic) == 0; };
    const auto byte = [&](std::size_t i) { return i < head.size() ? static_cast<unsigned char>(head[i]) : 0u; };
    const bool mpegSync = byte(0) == 0xFF && (byte(1) & 0xE0) == 0xE0;
    if (extension == "mp3" || extension == "mp2") return at(0, "ID3") || mpegSync;
    if (extension == "aac") return byte(0) == 0xFF && (byte(1) & 0xF6) == 0xF0;  // ADTS, layer 0
    if (extension == "ac3") return byte(0) == 0x0B && byte(1) == 0x77;
    if (extension == "m4a") return at(4, "ftyp");
    if (extension == "wma") return at(0, "\x30\x26\xB2\x75\x8E\x66\xCF\x11");
    if (extension == "flac") return at(0, "fLaC");
    if (extension == "ogg") return at(0, "OggS");
    if (extension == "wav") return at(0, "RIFF") && at(8, "WAVE");
    if (extension == "au") return at(0, ".snd");
    return false;
}

class SystemProfile : public ac::test::ProfileFiles, public ::testing::WithParamInterface<std::string> {
protected:
    void SetUp() override {
        std::vector<std::pair<std::string, std::string>> files;
        for (const std::string& name : ShippedProfiles()) {
            files.emplace_back(name, ac::test::ReadFile(AC_SOURCE_DIR "/data/profile/" + name));
        }
        WriteProfiles(files);
        m_profile = std::make_unique<ac::Profile>(SystemPath(GetParam()));
        ASSERT_TRUE(m_profile->IsLoaded()) << GetParam();
    }

    bool ValueInList(const std::string& key) const {
        std::vector<std::string> items;
        m_profile->GetValueList(key, items);
        return std::find(items.begin(), items.end(), m_profile->GetValue(key)) != items.end();
    }

    std::unique_ptr<ac::Profile> m_profile;
};

TEST_P(SystemProfile, IsACatalogueEntryWithConsistentValues) {
    static constexpr std::string_view kAdmitted[] = {"aac", "ape", "flac", "ac3", "au",  "m4a",
                                                     "mp2", "mp3", "ogg",  "wav", "asf", "xwmv"};
    const std::string format = ac::AsciiLowerText(m_profile->GetFormat());
    EXPECT_NE(std::find(std::begin(kAdmitted), std::end(kAdmitted), format), std::end(kAdmitted)) << format;
    EXPECT_TRUE(m_profile->IsSysProfile());
    EXPECT_FALSE(m_profile->GetName().empty());
    EXPECT_EQ(GetParam(), m_profile->GetExtName() + ".pf");
    // The grid would offer a value the list does not hold, and ctt would get something untested.
    for (const char* key : {"acodec", "ab", "ar", "ac"}) {
        if (m_profile->HasKey(key)) {
            EXPECT_TRUE(ValueInList(key)) << key << " = " << m_profile->GetValue(key);
        }
    }
    EXPECT_TRUE(m_profile->HasKey("acodec"));
    EXPECT_TRUE(m_profile->HasKey("outfilename"));  // brought by ss: the grid's name row
}

TEST_P(SystemProfile, ConvertsAToneThroughTheTool) {
    const std::string tool = AC_BIN_DIR "/ctt";
    if (!fs::exists(tool)) GTEST_SKIP() << "ctt is not built";
    const std::string source = m_tmp / "tone.wav";
    ac::test::WriteFile(source, ToneWav());
    ac::OutputNameRequest request;
    request.sourcePath = source;
    request.directory = m_tmp.Path();
    const std::string output = ac::MakeOutputPath(*m_profile, request, ac::NamingSettings{});
    const std::string text = ac::BuildConversionCommandText(source, output, 50, *m_profile);
    EXPECT_EQ(RunTool(tool, ac::platform::SplitCommandLine(text), m_tmp / "log"), 0)
        << text << "\n" << ac::test::ReadFile(m_tmp / "log");
    ASSERT_TRUE(fs::exists(output)) << output;
    EXPECT_GT(fs::file_size(output), 1000u);
    EXPECT_TRUE(StartsLikeItsFormat(m_profile->GetExtName(), ac::test::ReadFile(output).substr(0, 16)));
}

INSTANTIATE_TEST_SUITE_P(Shipped, SystemProfile, ::testing::ValuesIn(ShippedProfiles()),
                         [](const auto& info) { return info.param.substr(0, info.param.size() - 3); });

TEST(SystemProfiles, TheFallbackExists) {
    const auto names = ShippedProfiles();
    EXPECT_NE(std::find(names.begin(), names.end(), "mp3.pf"), names.end());
}

}  // namespace
