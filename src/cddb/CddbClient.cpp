#include "cddb/CddbClient.h"

#include "cddb/BatchFile.h"
#include "cddb/CddbTexts.h"
#include "cddb/DiscFile.h"
#include "cddb/RecordText.h"
#include "platform/AtomicFile.h"
#include "resources/Language.h"
#include "resources/TextFormat.h"

#include <fcntl.h>
#include <netdb.h>
#include <poll.h>
#include <pwd.h>
#include <sys/socket.h>
#include <sys/types.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <cstdlib>
#include <chrono>
#include <cstring>

namespace cddb {
namespace {

using Clock = std::chrono::steady_clock;

constexpr std::size_t kReadChunk = 4096;
constexpr std::size_t kMaxNameLength = 260;

std::string Text(std::uint32_t id) {
    return ac::g_Language.GetString(id);
}

// "\r\n\r\n" ends the HTTP header; what follows is the CDDB reply.
constexpr std::string_view kHeaderEnd = "\r\n\r\n";

bool IsListStatus(std::string_view body) {
    if (body.size() < 3) {
        return false;
    }
    const int status = ReadAtoi(body.substr(0, 3));
    return status >= 210 && status <= 219;
}

// A "." line ends a list. Servers end lines with "\r\n"; a few (and the transcripts people kept)
// use bare "\n", so both count. Answers where the line end before the "." starts.
std::size_t FindTerminator(std::string_view text, std::size_t from) {
    for (std::size_t at = text.find("\n.", from); at != std::string_view::npos;
         at = text.find("\n.", at + 1)) {
        const std::string_view rest = text.substr(at + 2);
        if (rest.starts_with("\r\n") || rest.starts_with("\n")) {
            return at > 0 && text[at - 1] == '\r' ? at - 1 : at;
        }
    }
    return std::string_view::npos;
}

// Hello names travel unencoded; a blank or a control character would end the request line.
std::string HelloName(std::string_view name) {
    std::string clean(name.substr(0, std::min(name.size(), kMaxNameLength)));
    for (char& c : clean) {
        if (static_cast<unsigned char>(c) <= ' ' || c == '&' || c == '+' || c == '#') {
            c = '_';
        }
    }
    return clean;
}

class Socket {
public:
    explicit Socket(int fd = -1) : m_fd(fd) {}
    ~Socket() {
        if (m_fd >= 0) {
            ::close(m_fd);
        }
    }
    Socket(const Socket&) = delete;
    Socket& operator=(const Socket&) = delete;
    int Get() const { return m_fd; }
    void Reset(int fd) {
        if (m_fd >= 0) {
            ::close(m_fd);
        }
        m_fd = fd;
    }

private:
    int m_fd;
};

}  // namespace

// ---- Values ---------------------------------------------------------------------------------

CddbHost::CddbHost(bool forQueries) : script(forQueries ? kQueryScript : kSubmitScript) {}

CddbHost ParseHostSetting(std::string_view text) {
    CddbHost host;
    const std::size_t amp = text.find('&');
    host.host = TrimAsciiSpace(text.substr(0, amp));
    if (amp != std::string_view::npos) {
        const std::string_view port = TrimAsciiSpace(text.substr(amp + 1));
        const int number = ReadAtoi(port);
        if (number > 0 && number < 65536) {
            host.port = number;
        }
    }
    return host;
}

std::string HostSettingText(std::string_view host, int port) {
    return std::string(host) + " & " + std::to_string(port);
}

bool ParseMatchLine(std::string_view line, CddbMatch& out) {
    // A reply was always read as a C string: nothing behind a NUL byte counts.
    line = line.substr(0, line.find('\0'));
    if (const std::size_t crlf = line.find("\r\n"); crlf != std::string_view::npos) {
        line = line.substr(0, crlf);
    } else if (const std::size_t lf = line.find('\n'); lf != std::string_view::npos) {
        line = line.substr(0, lf);
    }
    const std::vector<std::string_view> words = SplitWords(line, 2);
    if (words.size() < 2) {
        return false;
    }
    const std::string_view id = words[1];
    if (id.size() > 8 ||
        !std::all_of(id.begin(), id.end(), [](char c) { return ac::HexDigitValue(c) >= 0; })) {
        return false;
    }
    // The rest starts behind the id and the blanks that follow it.
    std::string_view rest =
        line.substr(static_cast<std::size_t>(id.data() - line.data()) + id.size());
    rest = TrimAsciiSpace(rest);
    if (rest.empty()) {
        return false;
    }
    out.category = words[0];
    out.discId = ReadHex(id);
    const std::size_t slash = rest.find('/');
    if (slash == std::string_view::npos) {
        out.artist.clear();
        out.title = DecodeServerText(rest);
    } else {
        out.artist = DecodeServerText(TrimAsciiSpace(rest.substr(0, slash)));
        out.title = DecodeServerText(TrimAsciiSpace(rest.substr(slash + 1)));
    }
    return true;
}

MatchResult ParseMatchList(std::string_view body, std::vector<CddbMatch>& matches,
                           std::vector<std::string>& replyLines) {
    matches.clear();
    replyLines.clear();
    body = body.substr(0, body.find('\0'));
    if (body.size() < 3) {
        return MatchResult::ProtocolError;
    }
    const int status = ReadAtoi(body.substr(0, 3));
    if (status >= 210 && status <= 219) {
        std::size_t at = body.find('\n');
        at = at == std::string_view::npos ? body.size() : at + 1;
        while (at < body.size()) {
            std::size_t end = body.find('\n', at);
            std::size_t next = end == std::string_view::npos ? body.size() : end + 1;
            if (end == std::string_view::npos) {
                end = body.size();
            } else if (end > at && body[end - 1] == '\r') {
                --end;
            }
            const std::string_view line = body.substr(at, end - at);
            at = next;
            // The "." that ends the list is no reply line.
            if (line == ".") {
                break;
            }
            replyLines.emplace_back(line);
            CddbMatch match;
            if (ParseMatchLine(line, match)) {
                matches.push_back(std::move(match));
            }
        }
        return matches.empty() ? MatchResult::ProtocolError : MatchResult::Matches;
    }
    if (status == 200 && body.size() > 5) {
        CddbMatch match;
        if (ParseMatchLine(body.substr(4), match)) {
            matches.push_back(std::move(match));
            return MatchResult::Matches;
        }
        return MatchResult::ProtocolError;
    }
    if (status == 202) {
        return MatchResult::NoMatch;
    }
    return MatchResult::ProtocolError;
}

std::string_view ReplyBody(std::string_view reply) {
    const std::size_t end = reply.find(kHeaderEnd);
    return end == std::string_view::npos ? std::string_view()
                                         : reply.substr(end + kHeaderEnd.size());
}

CddbCancel::CddbCancel() {
    if (::pipe2(m_pipe, O_CLOEXEC | O_NONBLOCK) != 0) {
        m_pipe[0] = m_pipe[1] = -1;
    }
}

CddbCancel::~CddbCancel() {
    for (int fd : m_pipe) {
        if (fd >= 0) {
            ::close(fd);
        }
    }
}

void CddbCancel::Cancel() {
    if (m_cancelled.exchange(true)) {
        return;
    }
    if (m_pipe[1] >= 0) {
        const char wake = 1;
        [[maybe_unused]] const ssize_t written = ::write(m_pipe[1], &wake, 1);
    }
}

// ---- The client -------------------------------------------------------------------------------

CCddbClient::CCddbClient() = default;

void CCddbClient::SetIdentity(std::string_view email, int protocolLevel) {
    email = TrimAsciiSpace(email);
    const std::size_t at = email.find('@');
    m_helloUser = HelloName(email.substr(0, at));
    m_helloHost = at == std::string_view::npos ? std::string() : HelloName(email.substr(at + 1));
    m_protocolLevel =
        protocolLevel >= 4 && protocolLevel <= 6 ? protocolLevel : kDefaultProtocolLevel;
}

std::string CCddbClient::LocalUserName() {
    char buffer[1024];
    passwd entry{};
    passwd* found = nullptr;
    if (::getpwuid_r(::geteuid(), &entry, buffer, sizeof buffer, &found) == 0 && found != nullptr &&
        found->pw_name != nullptr && *found->pw_name != '\0') {
        return HelloName(found->pw_name);
    }
    const char* user = std::getenv("USER");
    return HelloName(user != nullptr ? user : "");
}

std::string CCddbClient::LocalHostName() {
    char name[kMaxNameLength + 1] = {};
    if (::gethostname(name, kMaxNameLength) != 0) {
        return {};
    }
    return HelloName(name);
}

std::string CCddbClient::BuildHello() {
    const std::string user = m_helloUser.empty() ? LocalUserName() : m_helloUser;
    const std::string host = m_helloHost.empty() ? LocalHostName() : m_helloHost;
    return "hello=" + user + "+" + host + "+" + m_clientName + "+" + m_clientVersion +
           "&proto=" + std::to_string(m_protocolLevel);
}

std::string CCddbClient::ErrorText() const {
    return m_lastError != 0 ? std::string(std::strerror(m_lastError)) : std::string();
}

void CCddbClient::Message(const std::string& text) {
    if (m_sink) {
        m_sink(text);
    }
}

bool CCddbClient::WaitWritable(int socket) {
    const auto deadline = Clock::now() + std::chrono::milliseconds(m_timeoutMs);
    for (;;) {
        if (WasCancelled()) {
            return false;
        }
        const auto left =
            std::chrono::duration_cast<std::chrono::milliseconds>(deadline - Clock::now());
        if (left.count() <= 0) {
            m_lastError = ETIMEDOUT;
            return false;
        }
        pollfd fds[2] = {{socket, POLLOUT, 0},
                         {m_cancel ? m_cancel->WakeDescriptor() : -1, POLLIN, 0}};
        const int ready = ::poll(fds, 2, static_cast<int>(left.count()));
        if (ready < 0 && errno != EINTR) {
            m_lastError = errno;
            return false;
        }
        if (ready > 0 && (fds[0].revents & (POLLOUT | POLLERR | POLLHUP)) != 0) {
            int error = 0;
            socklen_t length = sizeof error;
            if (::getsockopt(socket, SOL_SOCKET, SO_ERROR, &error, &length) != 0) {
                error = errno;
            }
            m_lastError = error;
            return error == 0;
        }
    }
}

int CCddbClient::Connect(const CddbHost& host, Step& failure) {
    const std::string name = host.host.empty() ? std::string(kDefaultCddbServer) : host.host;
    addrinfo hints{};
    hints.ai_family = AF_UNSPEC;
    hints.ai_socktype = SOCK_STREAM;
    addrinfo* addresses = nullptr;
    if (::getaddrinfo(name.c_str(), std::to_string(host.port).c_str(), &hints, &addresses) != 0 ||
        addresses == nullptr) {
        // A host that cannot be resolved counts as a failed connect.
        m_lastError = EINVAL;
        failure = Step::NoConnection;
        return -1;
    }
    failure = Step::NoConnection;
    int connected = -1;
    bool anySocket = false;
    for (const addrinfo* address = addresses; address != nullptr && connected < 0;
         address = address->ai_next) {
        const int fd = ::socket(address->ai_family, SOCK_STREAM | SOCK_NONBLOCK | SOCK_CLOEXEC, 0);
        if (fd < 0) {
            m_lastError = errno;
            continue;
        }
        anySocket = true;
        if (::connect(fd, address->ai_addr, address->ai_addrlen) == 0 ||
            (errno == EINPROGRESS && WaitWritable(fd))) {
            connected = fd;
        } else {
            if (errno != EINPROGRESS) {
                m_lastError = errno;
            }
            ::close(fd);
        }
        if (WasCancelled()) {
            break;
        }
    }
    ::freeaddrinfo(addresses);
    if (connected < 0) {
        failure = WasCancelled() ? Step::Cancelled
                  : anySocket    ? Step::NoConnection
                                 : Step::NoSocket;
    }
    return connected;
}

ReadOutcome CCddbClient::ReadReply(int socket, ReplyMode mode, std::string& reply) {
    reply.clear();
    reply.reserve(kReadChunk);
    auto lastData = Clock::now();
    std::size_t searchFrom = 0;
    char chunk[kReadChunk];
    // Whether the reply so far is whole: a list at its "." line, any other status line whole.
    auto whole = [&](bool closed) {
        const std::size_t headerEnd = reply.find(kHeaderEnd);
        if (headerEnd == std::string::npos) {
            return false;
        }
        const std::size_t bodyStart = headerEnd + kHeaderEnd.size();
        const std::string_view body = std::string_view(reply).substr(bodyStart);
        const bool firstLine = body.find('\n') != std::string_view::npos;
        if (IsListStatus(body)) {
            // Only the bytes new since the last look, and the few before them that a
            // terminator split between two reads may start in.
            const std::size_t from = std::max(bodyStart, searchFrom > 4 ? searchFrom - 4 : 0);
            const std::size_t end = FindTerminator(reply, from);
            searchFrom = reply.size();
            if (end != std::string_view::npos) {
                reply.resize(end);
                return true;
            }
            // A server that closes right behind the "." sends no line end after it.
            if (closed && reply.size() >= bodyStart + 2 && reply.ends_with("\n.")) {
                reply.resize(reply.size() - (reply.ends_with("\r\n.") ? 3 : 2));
                return true;
            }
            return false;
        }
        if (mode == ReplyMode::StopByStatus && firstLine && body.size() >= 3 && body[0] == '2') {
            // 200 and 202 say all in their status line.
            return true;
        }
        // An error line or page is whole when the server closes, as HTTP/1.0 servers do.
        return closed && (firstLine || !body.empty());
    };
    for (;;) {
        if (WasCancelled()) {
            return ReadOutcome::Cancelled;
        }
        const auto silent =
            std::chrono::duration_cast<std::chrono::milliseconds>(Clock::now() - lastData);
        if (silent.count() >= static_cast<long long>(m_timeoutMs)) {
            m_lastError = ETIMEDOUT;
            return ReadOutcome::TimedOut;
        }
        pollfd fds[2] = {{socket, POLLIN, 0},
                         {m_cancel ? m_cancel->WakeDescriptor() : -1, POLLIN, 0}};
        const int ready = ::poll(fds, 2, static_cast<int>(m_timeoutMs - silent.count()));
        if (ready < 0) {
            if (errno == EINTR) {
                continue;
            }
            m_lastError = errno;
            return ReadOutcome::Failed;
        }
        if (ready == 0 || (fds[0].revents & (POLLIN | POLLHUP | POLLERR)) == 0) {
            continue;
        }
        const ssize_t got = ::recv(socket, chunk, sizeof chunk, 0);
        if (got < 0) {
            if (errno == EINTR || errno == EAGAIN || errno == EWOULDBLOCK) {
                continue;
            }
            m_lastError = errno;
            return ReadOutcome::Failed;
        }
        if (got == 0) {
            if (whole(true)) {
                return ReadOutcome::Ok;
            }
            m_lastError = ECONNRESET;
            return ReadOutcome::Failed;
        }
        if (reply.size() + static_cast<std::size_t>(got) > kMaxReplyBytes) {
            m_lastError = EMSGSIZE;
            return ReadOutcome::TooLarge;
        }
        reply.append(chunk, static_cast<std::size_t>(got));
        lastData = Clock::now();
        if (whole(false)) {
            return ReadOutcome::Ok;
        }
    }
}

CCddbClient::Step CCddbClient::Exchange(const CddbHost& host, const std::string& request,
                                        ReplyMode mode, std::string& reply) {
    m_lastError = 0;
    Step failure = Step::Ok;
    Socket socket(Connect(host, failure));
    if (socket.Get() < 0) {
        return failure;
    }
    // One send of the whole request; a short write is finished off rather than failed.
    for (std::size_t sent = 0; sent < request.size();) {
        const ssize_t written =
            ::send(socket.Get(), request.data() + sent, request.size() - sent, MSG_NOSIGNAL);
        if (written < 0 && (errno == EAGAIN || errno == EWOULDBLOCK)) {
            if (!WaitWritable(socket.Get())) {
                return WasCancelled() ? Step::Cancelled : Step::SendFailed;
            }
            continue;
        }
        if (written < 0 && errno != EINTR) {
            m_lastError = errno;
            return Step::SendFailed;
        }
        sent += written > 0 ? static_cast<std::size_t>(written) : 0;
    }
    switch (ReadReply(socket.Get(), mode, reply)) {
        case ReadOutcome::Ok:
            return Step::Ok;
        case ReadOutcome::Cancelled:
            return Step::Cancelled;
        case ReadOutcome::TimedOut:
            Message(Text(text::kTimeOut));
            m_lastResponse = reply;
            return Step::NoReply;
        case ReadOutcome::Failed:
        case ReadOutcome::TooLarge:
            break;
    }
    return Step::NoReply;
}

std::string CCddbClient::ErrorCodeText() const {
    return std::to_string(m_lastError);
}

bool CCddbClient::Query(const CddbHost& host, std::uint32_t discId, const DiscToc& toc,
                        std::vector<CddbMatch>& matches) {
    std::string fields = FormatDiscId(discId) + "+" + std::to_string(TrackCount(toc));
    for (int track = 0; track < TrackCount(toc); ++track) {
        fields += "+" + std::to_string(toc[static_cast<std::size_t>(track)].Frames());
    }
    fields += "+" + std::to_string(DiscLengthSeconds(toc));
    return RunQuery(host, fields, true, matches);
}

bool CCddbClient::QueryText(const CddbHost& host, std::string_view queryText,
                            std::vector<CddbMatch>& matches) {
    return RunQuery(host, queryText, false, matches);
}

bool CCddbClient::RunQuery(const CddbHost& host, std::string_view fields, bool keepForBatch,
                           std::vector<CddbMatch>& matches) {
    matches.clear();
    m_replyLines.clear();
    const std::string request = "GET " + host.script + "?cmd=cddb+query+" + std::string(fields) +
                                "&" + BuildHello() + " HTTP/1.0\r\n\r\n";
    std::string reply;
    const Step step = Exchange(host, request, ReplyMode::StopByStatus, reply);
    const std::string hostName = host.host.empty() ? std::string(kDefaultCddbServer) : host.host;
    switch (step) {
        case Step::Ok:
            break;
        case Step::Cancelled:
            return false;
        case Step::NoSocket:
            Message(ac::FormatText(Text(text::kQuerySocketFailed), {ErrorCodeText(), ErrorText()}));
            return false;
        case Step::SendFailed:
            Message(ac::FormatText(Text(text::kQuerySendFailed), {ErrorCodeText(), ErrorText()}));
            return false;
        case Step::NoConnection:
        case Step::NoReply:
            if (step == Step::NoConnection) {
                Message(ac::FormatText(Text(text::kConnectFailed), {hostName}));
            } else {
                m_lastError = EPROTONOSUPPORT;
                Message(Text(text::kQueryNoReply));
            }
            // A server that is silent or away today may answer another day: keep the query
            // for the batch pass, once.
            if (keepForBatch && !m_batchFile.empty()) {
                const std::vector<BatchRecord> kept = ReadBatchFile(m_batchFile);
                const bool known = std::any_of(kept.begin(), kept.end(), [&](const BatchRecord& r) {
                    return r.query == fields;
                });
                if (!known) {
                    AppendBatchRecord(m_batchFile, fields);
                }
            }
            return false;
    }
    m_lastResponse = reply;
    Message(DecodeServerText(reply));
    const MatchResult result = ParseMatchList(ReplyBody(reply), matches, m_replyLines);
    switch (result) {
        case MatchResult::Matches:
            m_lastResponse.clear();
            return true;
        case MatchResult::NoMatch:
            return false;
        case MatchResult::ProtocolError:
            m_lastError = EPROTONOSUPPORT;
            return false;
    }
    return false;
}

bool CCddbClient::ReadEntry(const CddbHost& host, std::uint32_t discId, const CddbMatch& match,
                            CddbEntry& entry) {
    const std::string request = "GET " + host.script + "?cmd=cddb+read+" + match.category + "+" +
                                FormatDiscId(discId) + "&" + BuildHello() + " HTTP/1.0\r\n\r\n";
    std::string reply;
    const Step step = Exchange(host, request, ReplyMode::ToTerminator, reply);
    const std::string hostName = host.host.empty() ? std::string(kDefaultCddbServer) : host.host;
    switch (step) {
        case Step::Ok:
            break;
        case Step::Cancelled:
            return false;
        case Step::NoSocket:
            Message(Text(text::kReadSocketFailed));
            return false;
        case Step::NoConnection:
            Message(ac::FormatText(Text(text::kConnectFailed), {hostName}));
            return false;
        case Step::SendFailed:
            Message(Text(text::kReadSendFailed));
            return false;
        case Step::NoReply:
            m_lastError = EPROTONOSUPPORT;
            Message(Text(text::kReadNoReply));
            return false;
    }
    Message(DecodeServerText(reply));
    m_lastResponse = reply;
    m_entryResult = ParseEntry(ReplyBody(reply), entry);
    // The id of the chosen match wins over the entry's DISCID line.
    entry.discId = discId;
    return m_entryResult == EntryResult::Ok;
}

}  // namespace cddb
