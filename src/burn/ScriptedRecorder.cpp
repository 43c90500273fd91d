#include "burn/ScriptedRecorder.h"

#include <chrono>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <thread>

namespace ac::burn {

ScriptedRecorder::ScriptedRecorder(std::string stateFile)
    : ImageRecorder((std::filesystem::path(stateFile).parent_path() / "fake").string()),
      m_stateFile(std::move(stateFile)) {}

std::map<std::string, std::string> ScriptedRecorder::Read() const {
    std::map<std::string, std::string> values;
    std::ifstream in(m_stateFile);
    for (std::string line; std::getline(in, line);) {
        const std::size_t equals = line.find('=');
        if (equals != std::string::npos)
            values[line.substr(0, equals)] = line.substr(equals + 1);
    }
    return values;
}

int ScriptedRecorder::Value(const char* key, int fallback) const {
    const auto values = Read();
    const auto found = values.find(key);
    return found == values.end() ? fallback : std::atoi(found->second.c_str());
}

void ScriptedRecorder::Log(const std::string& line) {
    std::lock_guard lock(m_logMutex);
    std::ofstream(m_stateFile + ".log", std::ios::app) << line << "\n";
}

std::string ScriptedRecorder::Name() const {
    const auto values = Read();
    const auto found = values.find("name");
    return found == values.end() ? std::string() : found->second;
}

int ScriptedRecorder::MediaType() {
    return Value("media", kMediaNone);
}

bool ScriptedRecorder::Capacity(std::int64_t& totalBlocks, std::int64_t& freeBlocks) {
    totalBlocks = kDiscBlocks;
    freeBlocks = Value("free", static_cast<int>(kDiscBlocks));
    return freeBlocks >= 0;
}

bool ScriptedRecorder::ReadDiskInfo(DiskInfoBlock& info) {
    info.fill(0);
    info[2] = static_cast<std::uint8_t>(Value("state", kDiscStateBlank) & 3);
    // The media type in the block too, so a changed disc reads as a changed block.
    info[8] = static_cast<std::uint8_t>(Value("media", 0));
    return true;
}

bool ScriptedRecorder::CanErase() {
    return Value("erasable", 0) != 0 && MediaType() == kMediaCdRw;
}

bool ScriptedRecorder::Erase(bool quick) {
    Log(quick ? "erase quick" : "erase full");
    // Long enough for the dialog's bar to be seen moving.
    std::this_thread::sleep_for(std::chrono::milliseconds(Value("erasems", 700)));
    std::ofstream(m_stateFile, std::ios::app) << "state=0\n";
    return true;
}

void ScriptedRecorder::Eject() {
    Log("eject");
}

}  // namespace ac::burn
