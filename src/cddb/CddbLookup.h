#pragma once
// One lookup of one disc, as the lookup worker and acrip run it: query the server, let the user
// choose among several matches, read the chosen entry and turn it into the flat record; and the
// batch pass, which does the same for every record of CDDB_Batch.txt and stores each answer.
//
// The observer is told what happens: the current action, every raw reply and failure text, and
// asked for the choice among matches. The worker's observer posts to the dialog and waits for
// the choice; acrip's prints.
//
// Thread contract: runs on the calling thread, blocking; the observer is called on it.

#include "cddb/CddbClient.h"
#include "cddb/DiscInfo.h"
#include "cddb/DiscToc.h"

#include <string>
#include <string_view>
#include <vector>

namespace cddb {

struct LookupSettings {
    CddbHost host;
    unsigned timeoutMs = 20000;
    std::string email;  // cddb_email
    int protocolLevel = kDefaultProtocolLevel;
    std::string batchFile;  // empty: a failed query is not kept
};

class ILookupObserver {
public:
    virtual ~ILookupObserver() = default;
    virtual void ShowAction(const std::string& text) = 0;
    // Replaces the message text: a raw reply or a failure text.
    virtual void ShowMessage(const std::string& text) = 0;
    // Asked only with two rows or more; answers a row index (anything out of range takes the
    // first).
    virtual int ChooseMatch(const std::vector<std::string>& rows) = 0;
    // The server answered, but its disc entry could not be read: why, in words. The window
    // keeps the raw reply in view and says nothing more, as it always has.
    virtual void ShowEntryProblem(const std::string& /*reason*/) {}
};

// Query from the table of contents, choose, read. False, with `out` cleared, when any step
// failed or was cancelled: what went wrong stands in the observer's message.
bool LookupDisc(const LookupSettings& settings, const DiscToc& toc, ILookupObserver& observer,
                const CddbCancel* cancel, CDDiscInfo& out);

// The same from a batch record's query text.
bool LookupQueryText(const LookupSettings& settings, std::string_view queryText,
                     ILookupObserver& observer, const CddbCancel* cancel, CDDiscInfo& out);

struct BatchPassResult {
    int records = 0;
    int answered = 0;       // .cddb files written
    bool complete = false;  // every record answered; false when one failed or was cancelled
};

// Works through the records of a batch text in order, writing each answer as a .cddb file
// (format 0, genre as it came) into `folder` under the record's id text. The first record that
// fails ends the pass. The text is never changed: each pass works through all records.
BatchPassResult RunBatchPass(const LookupSettings& settings, std::string_view batchText,
                             const std::string& folder, ILookupObserver& observer,
                             const CddbCancel* cancel);

}  // namespace cddb
