#pragma once
// A CDDB server for tests: HTTP/1.0 on 127.0.0.1 at a free port, one thread per connection. It
// answers "cddb query" and "cddb read" from its records (added one by one, or a folder laid
// out as the freedb dumps are, CATEGORY/DISCID), replays captured replies byte for byte, and
// misbehaves on demand, one connection at a time. It records the exact text of every request
// so that a test can check what the client sent.
//
// A query of an id with one record answers 200, with several 211 and a list, with none 202.
// Nothing here reaches beyond the loopback address.

#include <netinet/in.h>
#include <poll.h>
#include <sys/socket.h>
#include <unistd.h>

#include <algorithm>
#include <atomic>
#include <chrono>
#include <cstdint>
#include <cstdio>
#include <deque>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <map>
#include <memory>
#include <mutex>
#include <sstream>
#include <string>
#include <thread>
#include <vector>

namespace ac::test {

enum class CddbMisbehaviour {
    None,         // answer from the records
    Silent,       // read the request, then say nothing until the client goes
    Trickle,      // the proper answer, one byte at a time with a gap between bytes
    CloseEarly,   // the header and half the body, then close
    NoMatch,      // 202 whatever the records hold
    HtmlError,    // HTTP 404 with an HTML page
    ServerError,  // a "500" CDDB line
    Pieces,       // the proper answer in pieces of a few bytes
    Huge,         // a 210 reply of 10 MB
    Replay,       // a file's bytes behind the HTTP header, as they are
};

class CddbTestServer {
public:
    CddbTestServer() {
        m_listen = ::socket(AF_INET, SOCK_STREAM | SOCK_CLOEXEC, 0);
        sockaddr_in address{};
        address.sin_family = AF_INET;
        address.sin_addr.s_addr = htonl(INADDR_LOOPBACK);
        address.sin_port = 0;
        const int yes = 1;
        ::setsockopt(m_listen, SOL_SOCKET, SO_REUSEADDR, &yes, sizeof yes);
        ::bind(m_listen, reinterpret_cast<sockaddr*>(&address), sizeof address);
        ::listen(m_listen, 64);
        socklen_t length = sizeof address;
        ::getsockname(m_listen, reinterpret_cast<sockaddr*>(&address), &length);
        m_port = ntohs(address.sin_port);
        if (::pipe(m_stop) != 0) {
            m_stop[0] = m_stop[1] = -1;
        }
        m_acceptor = std::thread([this] { AcceptLoop(); });
    }

    ~CddbTestServer() {
        m_stopping = true;
        const char byte = 1;
        [[maybe_unused]] auto written = ::write(m_stop[1], &byte, 1);
        m_acceptor.join();
        std::vector<std::thread> handlers;
        {
            std::lock_guard lock(m_mutex);
            handlers.swap(m_handlers);
        }
        for (std::thread& handler : handlers) {
            handler.join();
        }
        ::close(m_listen);
        ::close(m_stop[0]);
        ::close(m_stop[1]);
    }

    int Port() const { return m_port; }
    // The form of the setting remotecddb.
    std::string HostSetting() const { return "127.0.0.1 & " + std::to_string(m_port); }

    // A record as a read returns it, its xmcd text without status line and "." line. The
    // match line of a query shows `matchTitle` ("Artist / Album").
    void AddRecord(const std::string& category, std::uint32_t discId, const std::string& matchTitle,
                   const std::string& xmcd) {
        std::lock_guard lock(m_mutex);
        m_records.push_back({category, discId, matchTitle, xmcd});
    }

    // Every file CATEGORY/DISCID below folder; the match title comes from its DTITLE line.
    void LoadFolder(const std::string& folder) {
        namespace fs = std::filesystem;
        for (const auto& category : fs::directory_iterator(folder)) {
            if (!category.is_directory())
                continue;
            for (const auto& file : fs::directory_iterator(category.path())) {
                std::ifstream in(file.path(), std::ios::binary);
                const std::string text((std::istreambuf_iterator<char>(in)), {});
                std::string title;
                if (const auto at = text.find("DTITLE="); at != std::string::npos) {
                    title = text.substr(at + 7, text.find_first_of("\r\n", at) - at - 7);
                }
                AddRecord(category.path().filename().string(),
                          static_cast<std::uint32_t>(
                              std::stoul(file.path().filename().string(), nullptr, 16)),
                          title, text);
            }
        }
    }

    // The next connections misbehave in this order; after them the server answers properly.
    void Next(CddbMisbehaviour how, const std::string& replayFile = {}) {
        std::lock_guard lock(m_mutex);
        m_next.push_back({how, replayFile});
    }
    void SetTrickleGap(std::chrono::milliseconds gap) {
        m_trickleGapMs = static_cast<int>(gap.count());
    }

    std::vector<std::string> Requests() {
        std::lock_guard lock(m_mutex);
        return m_requests;
    }
    int Connections() const { return m_connections.load(); }
    void ClearRequests() {
        std::lock_guard lock(m_mutex);
        m_requests.clear();
    }

private:
    struct Record {
        std::string category;
        std::uint32_t discId;
        std::string matchTitle;
        std::string xmcd;
    };
    struct Plan {
        CddbMisbehaviour how = CddbMisbehaviour::None;
        std::string replayFile;
    };

    static std::string Hex(std::uint32_t id) {
        char text[9];
        std::snprintf(text, sizeof text, "%08x", id);
        return text;
    }

    void AcceptLoop() {
        while (!m_stopping) {
            pollfd fds[2] = {{m_listen, POLLIN, 0}, {m_stop[0], POLLIN, 0}};
            if (::poll(fds, 2, -1) <= 0 || (fds[1].revents & POLLIN) != 0) {
                continue;
            }
            const int client = ::accept4(m_listen, nullptr, nullptr, SOCK_CLOEXEC);
            if (client < 0)
                continue;
            ++m_connections;
            Plan plan;
            std::lock_guard lock(m_mutex);
            if (!m_next.empty()) {
                plan = m_next.front();
                m_next.pop_front();
            }
            // Handlers that have ended are joined as new ones come, so a long run of
            // lookups does not pile up threads.
            for (std::size_t i = 0; i < m_handlers.size();) {
                if (m_done[i]->load()) {
                    m_handlers[i].join();
                    m_handlers.erase(m_handlers.begin() + static_cast<std::ptrdiff_t>(i));
                    m_done.erase(m_done.begin() + static_cast<std::ptrdiff_t>(i));
                } else {
                    ++i;
                }
            }
            auto done = std::make_shared<std::atomic<bool>>(false);
            m_done.push_back(done);
            m_handlers.emplace_back([this, client, plan, done] {
                Serve(client, plan);
                ::close(client);
                *done = true;
            });
        }
    }

    // Waits up to `ms` for the client to close or the server to stop; true when either did.
    bool Gone(int client, int ms) {
        pollfd fds[2] = {{client, POLLIN, 0}, {m_stop[0], POLLIN, 0}};
        if (::poll(fds, 2, ms) <= 0)
            return false;
        if (fds[1].revents != 0)
            return true;
        char byte;
        return ::recv(client, &byte, 1, MSG_DONTWAIT) <= 0;
    }

    bool Send(int client, std::string_view bytes) {
        while (!bytes.empty()) {
            const ssize_t sent = ::send(client, bytes.data(), bytes.size(), MSG_NOSIGNAL);
            if (sent <= 0)
                return false;
            bytes.remove_prefix(static_cast<std::size_t>(sent));
        }
        return true;
    }

    std::string ReadRequest(int client) {
        std::string request;
        char buffer[4096];
        while (request.find("\r\n\r\n") == std::string::npos && request.size() < 65536) {
            pollfd fds[2] = {{client, POLLIN, 0}, {m_stop[0], POLLIN, 0}};
            if (::poll(fds, 2, 5000) <= 0 || fds[1].revents != 0)
                break;
            const ssize_t got = ::recv(client, buffer, sizeof buffer, 0);
            if (got <= 0)
                break;
            request.append(buffer, static_cast<std::size_t>(got));
        }
        return request;
    }

    // The CDDB reply to a request line, from the records.
    std::string Answer(const std::string& request) {
        const std::size_t cmd = request.find("cmd=");
        const std::size_t end = request.find_first_of("& ", cmd);
        std::vector<std::string> words;
        if (cmd != std::string::npos) {
            std::istringstream in(request.substr(cmd + 4, end - cmd - 4));
            for (std::string word; std::getline(in, word, '+');)
                words.push_back(word);
        }
        std::lock_guard lock(m_mutex);
        if (words.size() >= 4 && words[0] == "cddb" && words[1] == "query") {
            std::vector<const Record*> found;
            for (const Record& record : m_records) {
                if (Hex(record.discId) == words[2])
                    found.push_back(&record);
            }
            if (found.empty())
                return "202 No match for disc ID " + words[2] + ".\r\n";
            if (found.size() == 1) {
                return "200 " + found[0]->category + " " + Hex(found[0]->discId) + " " +
                       found[0]->matchTitle + "\r\n";
            }
            std::string list =
                "211 Found inexact matches, list follows (until terminating `.')\r\n";
            for (const Record* record : found) {
                list += record->category + " " + Hex(record->discId) + " " + record->matchTitle +
                        "\r\n";
            }
            return list + ".\r\n";
        }
        if (words.size() >= 4 && words[0] == "cddb" && words[1] == "read") {
            for (const Record& record : m_records) {
                if (record.category == words[2] && Hex(record.discId) == words[3]) {
                    std::string body = record.xmcd;
                    if (!body.empty() && body.back() != '\n')
                        body += "\r\n";
                    return "210 " + record.category + " " + words[3] +
                           " CD database entry follows (until terminating `.')\r\n" + body +
                           ".\r\n";
                }
            }
            return "401 " + words[2] + " " + words[3] + " No such CD entry in database.\r\n";
        }
        return "500 Unrecognized command.\r\n";
    }

    void Serve(int client, const Plan& plan) {
        const std::string request = ReadRequest(client);
        {
            std::lock_guard lock(m_mutex);
            m_requests.push_back(request);
        }
        const std::string header = "HTTP/1.0 200 OK\r\nContent-Type: text/plain\r\n\r\n";
        switch (plan.how) {
            case CddbMisbehaviour::None:
                Send(client, header + Answer(request));
                return;
            case CddbMisbehaviour::Silent:
                while (!Gone(client, 100)) {
                }
                return;
            case CddbMisbehaviour::Trickle: {
                const std::string reply = header + Answer(request);
                for (char byte : reply) {
                    if (!Send(client, std::string_view(&byte, 1)) || Gone(client, m_trickleGapMs))
                        return;
                }
                return;
            }
            case CddbMisbehaviour::CloseEarly: {
                const std::string body = Answer(request);
                Send(client, header + body.substr(0, body.size() / 2));
                return;
            }
            case CddbMisbehaviour::NoMatch:
                Send(client, header + "202 No match for disc ID.\r\n");
                return;
            case CddbMisbehaviour::HtmlError:
                Send(client,
                     "HTTP/1.0 404 Not Found\r\nContent-Type: text/html\r\n\r\n"
                     "<!DOCTYPE html>\n<html><head><title>404 Not Found</title></head>\n"
                     "<body><h1>Not Found</h1><p>The requested URL was not "
                     "found.</p></body></html>\n");
                return;
            case CddbMisbehaviour::ServerError:
                Send(client,
                     header + "500 Command syntax error: incorrect arg count for handshake.\r\n");
                return;
            case CddbMisbehaviour::Pieces: {
                const std::string reply = header + Answer(request);
                for (std::size_t at = 0; at < reply.size(); at += 3) {
                    if (!Send(client, reply.substr(at, 3)) || Gone(client, 2))
                        return;
                }
                return;
            }
            case CddbMisbehaviour::Huge: {
                std::string block;
                for (int line = 0; line < 1000; ++line)
                    block += "# padding padding padding padding padding padding\r\n";
                if (!Send(client,
                          header + "210 rock 00000000 CD database entry follows\r\n# xmcd\r\n"))
                    return;
                for (std::size_t sent = 0; sent < 10u * 1024 * 1024; sent += block.size()) {
                    if (!Send(client, block))
                        return;
                }
                Send(client, ".\r\n");
                return;
            }
            case CddbMisbehaviour::Replay: {
                std::ifstream in(plan.replayFile, std::ios::binary);
                Send(client, header + std::string((std::istreambuf_iterator<char>(in)), {}));
                return;
            }
        }
    }

    int m_listen = -1;
    int m_port = 0;
    int m_stop[2] = {-1, -1};
    std::atomic<bool> m_stopping{false};
    std::atomic<int> m_connections{0};
    std::atomic<int> m_trickleGapMs{1000};
    std::thread m_acceptor;
    std::mutex m_mutex;
    std::vector<std::thread> m_handlers;
    std::vector<std::shared_ptr<std::atomic<bool>>> m_done;
    std::vector<Record> m_records;
    std::deque<Plan> m_next;
    std::vector<std::string> m_requests;
};

}  // namespace ac::test
