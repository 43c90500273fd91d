#pragma once
// A base folder for one test with a data.pkg built from a few entries, and a user data folder
// of its own for user.pkg and the miss log.

#include "resources/PackageWriter.h"

#include <gtest/gtest.h>

#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <sstream>
#include <string>
#include <utility>
#include <vector>

#include "TempDir.h"

#include "Files.h"

namespace ac::test {


class PackageDir : public ::testing::Test {
protected:
    // The base folder is spelt with a capital: only the part behind it may ever be folded.
    PackageDir() : m_base(m_tmp / "Base") {
        std::filesystem::create_directory(m_base);
        ::setenv("XDG_DATA_HOME", (m_tmp / "xdg").c_str(), 1);
    }

    // Name and contents; a name ending in '/' is a directory entry.
    void WritePackage(const std::vector<std::pair<std::string, std::string>>& entries) {
        ac::PackageWriter writer;
        ASSERT_TRUE(writer.Create());
        for (const auto& [name, data] : entries) {
            ASSERT_TRUE(name.ends_with('/') ? writer.AddDirectory(name) : writer.Put(name, data));
        }
        ASSERT_TRUE(writer.Commit(m_base + "/data.pkg"));
    }

    std::string Logical(const std::string& below) const { return m_base + "\\" + below; }
    std::string UserData(const std::string& name) const {
        return m_tmp / ("xdg/audio-converter/" + name);
    }

    TempDir m_tmp;
    std::string m_base;
};

}  // namespace ac::test
