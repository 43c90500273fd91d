// The hand-over of files from a later start to the running copy, over a real UNIX socket.
#include "platform/InstanceChannel.h"

#include "../support/TempDir.h"

#include <gtest/gtest.h>

#include <chrono>
#include <condition_variable>
#include <fstream>
#include <mutex>
#include <thread>

namespace ac::platform {
namespace {

using namespace std::chrono_literals;

class Received {
public:
    void Add(std::vector<std::string> paths) {
        std::lock_guard lock(m_mutex);
        m_batches.push_back(std::move(paths));
        m_changed.notify_all();
    }
    // The batches once `count` arrived, or what came within two seconds.
    std::vector<std::vector<std::string>> Wait(std::size_t count) {
        std::unique_lock lock(m_mutex);
        m_changed.wait_for(lock, 2s, [&] { return m_batches.size() >= count; });
        return m_batches;
    }

private:
    std::mutex m_mutex;
    std::condition_variable m_changed;
    std::vector<std::vector<std::string>> m_batches;
};

TEST(InstanceChannelTest, PathsArriveByteForByteAndAnEmptyHandOverStillArrives) {
    test::TempDir dir;
    const std::string socket = dir / "s.sock";
    // A socket file left by a copy that was killed does not stop the next one.
    std::ofstream(socket) << "stale";
    Received received;
    InstanceListener listener;
    ASSERT_TRUE(
        listener.Start(socket, [&](std::vector<std::string> paths) { received.Add(paths); }));

    const std::vector<std::string> odd = {"/music/a \"quoted\" name.flac", "/music/back\\slash.mp3",
                                          "/music/new\nline.wav", "/music/latin1 \xE9t\xE9.ogg"};
    EXPECT_TRUE(SendPaths(socket, odd));
    EXPECT_TRUE(SendPaths(socket, {}));
    const auto batches = received.Wait(2);
    ASSERT_EQ(batches.size(), 2u);
    EXPECT_EQ(batches[0], odd);
    EXPECT_TRUE(batches[1].empty()) << "a bare second start only brings the window forward";
}

TEST(InstanceChannelTest, ASecondStartWaitsForAFirstThatIsStillStartingAndGivesUpOnNobody) {
    test::TempDir dir;
    const std::string socket = dir / "s.sock";
    const auto before = std::chrono::steady_clock::now();
    EXPECT_FALSE(SendPaths(socket, {"/a.wav"}, 300)) << "nobody listens";
    EXPECT_LT(std::chrono::steady_clock::now() - before, 2s);

    Received received;
    InstanceListener listener;
    std::thread late([&] {
        std::this_thread::sleep_for(400ms);
        listener.Start(socket, [&](std::vector<std::string> paths) { received.Add(paths); });
    });
    EXPECT_TRUE(SendPaths(socket, {"/b.wav"}, 5000));
    late.join();
    const auto batches = received.Wait(1);
    ASSERT_EQ(batches.size(), 1u);
    EXPECT_EQ(batches[0], std::vector<std::string>{"/b.wav"});
    listener.Stop();
    EXPECT_FALSE(std::filesystem::exists(socket)) << "a copy that ends takes its socket along";
}

}  // namespace
}  // namespace ac::platform
