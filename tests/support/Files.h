#pragma once
// Whole files in and out for tests. One definition for every test: two helpers of one name
// with different bodies would be one function to the linker, whichever it met first.

#include <filesystem>
#include <fstream>
#include <iterator>
#include <string>

namespace ac::test {

inline std::string ReadFile(const std::string& path) {
    std::ifstream in(path, std::ios::binary);
    return std::string(std::istreambuf_iterator<char>(in), std::istreambuf_iterator<char>());
}

// Makes the folders on the way.
inline void WriteFile(const std::string& path, const std::string& bytes) {
    std::filesystem::create_directories(std::filesystem::path(path).parent_path());
    std::ofstream out(path, std::ios::binary);
    out.write(bytes.data(), static_cast<std::streamsize>(bytes.size()));
}

}  // namespace ac::test
