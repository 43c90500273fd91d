#pragma once
// CCddbClient: the CDDB protocol over plain HTTP/1.0 to one server. Each exchange (a query, a
// read) opens its own connection, sends one request line and a blank line, reads the reply and
// closes, on every path, so a lookup is two connections. The client never shows anything
// itself: every raw reply and every failure text goes to its message sink (the Message box of
// the "CDDB Response" dialog, through the UI queue), and the operation answers false.
//
//   GET
//   /~cddb/cddb.cgi?cmd=cddb+query+940aac0b+11+150+...+2533&hello=joe+example.org+MfcCDDB+1.14&proto=4
//   HTTP/1.0
//
// Thread contract: one object per lookup, used by one thread at a time (the lookup worker or a
// terminal tool). The sink is called on that thread. A CddbCancel may be tripped from any
// thread; it wakes the client out of connecting and reading at once.

#include "cddb/CddbEntry.h"
#include "cddb/DiscToc.h"

#include <atomic>
#include <cstdint>
#include <functional>
#include <string>
#include <string_view>
#include <vector>

namespace cddb {

// The public server used when the settings name none. It answers only clients that say who
// they are: the hello's user and host come from the setting cddb_email.
inline constexpr std::string_view kDefaultCddbServer = "gnudb.gnudb.org";
inline constexpr int kDefaultCddbPort = 80;
inline constexpr std::string_view kQueryScript = "/~cddb/cddb.cgi";
inline constexpr std::string_view kSubmitScript = "/~cddb/submit.cgi";
inline constexpr std::string_view kClientName = "MfcCDDB";
inline constexpr std::string_view kClientVersion = "1.14";
inline constexpr int kDefaultProtocolLevel = 4;
// No entry comes near this; a reply that grows past it is no CDDB reply, and memory stays flat.
inline constexpr std::size_t kMaxReplyBytes = 4 * 1024 * 1024;

struct CddbHost {
    // false selects the submit script, which nothing of this program uses.
    explicit CddbHost(bool forQueries = true);
    std::string host;  // empty: kDefaultCddbServer
    int port = kDefaultCddbPort;
    std::string script;
};

// "gnudb.gnudb.org & 80", the form of the settings remotecddb and addrN. A missing or bad port
// gives 80; blanks round both parts are dropped.
CddbHost ParseHostSetting(std::string_view text);
std::string HostSettingText(std::string_view host, int port);

struct CddbMatch {
    std::string category;
    std::uint32_t discId = 0;
    std::string artist;
    std::string title;
};

// One line of a match list, "rock 940aac0b Nightwish / Once": a category word, a hexadecimal id
// of one to eight digits, and the rest up to the line end, split at its first '/' into artist
// and title (no '/': all title). False when a field is missing or the id is not hexadecimal.
bool ParseMatchLine(std::string_view line, CddbMatch& out);

enum class MatchResult {
    Matches,        // at least one match (a 21x list with a line that parsed, or a 200)
    NoMatch,        // 202: the server knows no such disc
    ProtocolError,  // anything else, an empty list included
};

// The body of a query reply (behind the HTTP header). `replyLines` gets every line of a 21x
// list behind its status line, raw; `matches` those that parsed. Both are emptied first.
MatchResult ParseMatchList(std::string_view body, std::vector<CddbMatch>& matches,
                           std::vector<std::string>& replyLines);

// The CDDB reply behind the first blank line of an HTTP reply; empty when there is none.
std::string_view ReplyBody(std::string_view reply);

// Trips a lookup from another thread: the client's waits include its wake descriptor.
class CddbCancel {
public:
    CddbCancel();
    ~CddbCancel();
    CddbCancel(const CddbCancel&) = delete;
    CddbCancel& operator=(const CddbCancel&) = delete;

    void Cancel();
    bool IsCancelled() const { return m_cancelled.load(); }
    // Readable once cancelled; -1 when no pipe could be made (then only the flag counts).
    int WakeDescriptor() const { return m_pipe[0]; }

private:
    std::atomic<bool> m_cancelled{false};
    int m_pipe[2] = {-1, -1};
};

enum class ReplyMode {
    ToTerminator = 0,  // read: up to the "." line
    StopByStatus = 1,  // query: a list up to its "." line, any other reply as soon as it is whole
};

enum class ReadOutcome { Ok, TimedOut, Failed, TooLarge, Cancelled };

class CCddbClient {
public:
    using MessageSink = std::function<void(const std::string&)>;

    CCddbClient();
    virtual ~CCddbClient() = default;

    // Silence longer than this ends a reply; also the limit of one connect.
    void SetTimeout(unsigned milliseconds) { m_timeoutMs = milliseconds; }
    unsigned Timeout() const { return m_timeoutMs; }
    // The settings cddb_email ("joe@example.org": user and host of the hello; empty keeps the
    // local user and host names) and cddb_proto (4 to 6; anything else is 4).
    void SetIdentity(std::string_view email, int protocolLevel);
    // Where a query that went unanswered is kept; empty keeps nothing.
    void SetBatchFile(std::string path) { m_batchFile = std::move(path); }
    void SetMessageSink(MessageSink sink) { m_sink = std::move(sink); }
    void SetCancel(const CddbCancel* cancel) { m_cancel = cancel; }

    bool Query(const CddbHost& host, std::uint32_t discId, const DiscToc& toc,
               std::vector<CddbMatch>& matches);
    // queryText holds the four query fields already, as a batch record does.
    bool QueryText(const CddbHost& host, std::string_view queryText,
                   std::vector<CddbMatch>& matches);
    bool ReadEntry(const CddbHost& host, std::uint32_t discId, const CddbMatch& match,
                   CddbEntry& entry);

    // strerror of the last error, or empty.
    std::string ErrorText() const;
    int LastError() const { return m_lastError; }
    const std::string& LastResponse() const { return m_lastResponse; }
    const std::vector<std::string>& ReplyLines() const { return m_replyLines; }
    EntryResult LastEntryResult() const { return m_entryResult; }
    bool WasCancelled() const { return m_cancel != nullptr && m_cancel->IsCancelled(); }

    // "hello=USER+HOST+MfcCDDB+1.14&proto=4"
    virtual std::string BuildHello();
    virtual std::string LocalUserName();
    virtual std::string LocalHostName();
    // Reads one reply from a connected socket into `reply`. Waits with poll, so data wakes it
    // at once; the time-out counts silence since the last data, not the whole reply.
    virtual ReadOutcome ReadReply(int socket, ReplyMode mode, std::string& reply);

private:
    enum class Step { Ok, NoSocket, NoConnection, SendFailed, NoReply, Cancelled };

    Step Exchange(const CddbHost& host, const std::string& request, ReplyMode mode,
                  std::string& reply);
    int Connect(const CddbHost& host, Step& failure);
    bool WaitWritable(int socket);
    bool RunQuery(const CddbHost& host, std::string_view fields, bool keepForBatch,
                  std::vector<CddbMatch>& matches);
    void Message(const std::string& text);
    std::string ErrorCodeText() const;

    unsigned m_timeoutMs = 60000;
    std::string m_clientName{kClientName};
    std::string m_clientVersion{kClientVersion};
    int m_protocolLevel = kDefaultProtocolLevel;
    std::string m_helloUser;  // empty: LocalUserName
    std::string m_helloHost;  // empty: LocalHostName
    std::string m_batchFile;
    MessageSink m_sink;
    const CddbCancel* m_cancel = nullptr;

    std::string m_lastResponse;
    int m_lastError = 0;
    std::vector<std::string> m_replyLines;
    EntryResult m_entryResult = EntryResult::Ok;
};

}  // namespace cddb
