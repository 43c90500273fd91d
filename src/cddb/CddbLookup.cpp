#include "cddb/CddbLookup.h"

#include "cddb/BatchFile.h"
#include "cddb/CddbTexts.h"
#include "cddb/DiscFile.h"
#include "resources/Language.h"
#include "resources/TextFormat.h"

namespace cddb {
namespace {

void Configure(CCddbClient& client, const LookupSettings& settings, ILookupObserver& observer,
               const CddbCancel* cancel) {
    client.SetTimeout(settings.timeoutMs);
    client.SetIdentity(settings.email, settings.protocolLevel);
    client.SetBatchFile(settings.batchFile);
    client.SetCancel(cancel);
    client.SetMessageSink([&observer](const std::string& text) { observer.ShowMessage(text); });
}

// Several matches are the user's to choose; one, or an exact match, is taken as it is.
const CddbMatch& Choose(const CCddbClient& client, const std::vector<CddbMatch>& matches,
                        ILookupObserver& observer) {
    if (matches.size() < 2) {
        return matches.front();
    }
    std::vector<std::string> rows;
    for (const std::string& line : client.ReplyLines()) {
        CddbMatch parsed;
        if (ParseMatchLine(line, parsed)) {
            rows.push_back(DecodeServerText(line));
        }
    }
    const int choice = observer.ChooseMatch(rows);
    return choice >= 0 && static_cast<std::size_t>(choice) < matches.size()
               ? matches[static_cast<std::size_t>(choice)]
               : matches.front();
}

bool ReadChosen(CCddbClient& client, const LookupSettings& settings,
                const std::vector<CddbMatch>& matches, ILookupObserver& observer,
                const CddbCancel* cancel, CDDiscInfo& out) {
    const CddbMatch match = Choose(client, matches, observer);
    if (cancel != nullptr && cancel->IsCancelled()) {
        return false;
    }
    observer.ShowAction(ac::g_Language.GetString(text::kReadAction));
    CddbEntry entry;
    if (!client.ReadEntry(settings.host, match.discId, match, entry)) {
        if (client.LastEntryResult() != EntryResult::Ok) {
            observer.ShowEntryProblem(EntryResultText(client.LastEntryResult()));
        }
        return false;
    }
    EntryToDiscInfo(match.category, entry, out);
    return true;
}

}  // namespace

bool LookupDisc(const LookupSettings& settings, const DiscToc& toc, ILookupObserver& observer,
                const CddbCancel* cancel, CDDiscInfo& out) {
    out.Clear();
    if (TrackCount(toc) <= 0) {
        return false;
    }
    CCddbClient client;
    Configure(client, settings, observer, cancel);
    observer.ShowAction(ac::g_Language.GetString(text::kQueryAction));
    std::vector<CddbMatch> matches;
    if (!client.Query(settings.host, ComputeDiscId(toc), toc, matches)) {
        return false;
    }
    const bool found = ReadChosen(client, settings, matches, observer, cancel, out);
    if (!found) {
        out.Clear();
    }
    return found;
}

bool LookupQueryText(const LookupSettings& settings, std::string_view queryText,
                     ILookupObserver& observer, const CddbCancel* cancel, CDDiscInfo& out) {
    out.Clear();
    CCddbClient client;
    Configure(client, settings, observer, cancel);
    observer.ShowAction(ac::g_Language.GetString(text::kQueryAction));
    std::vector<CddbMatch> matches;
    if (!client.QueryText(settings.host, queryText, matches)) {
        return false;
    }
    const bool found = ReadChosen(client, settings, matches, observer, cancel, out);
    if (!found) {
        out.Clear();
    }
    return found;
}

BatchPassResult RunBatchPass(const LookupSettings& settings, std::string_view batchText,
                             const std::string& folder, ILookupObserver& observer,
                             const CddbCancel* cancel) {
    const std::vector<BatchRecord> records = ParseBatchText(batchText);
    BatchPassResult result;
    result.records = static_cast<int>(records.size());
    // The batch pass itself keeps nothing: its records are in the file already.
    LookupSettings passSettings = settings;
    passSettings.batchFile.clear();
    for (const BatchRecord& record : records) {
        if (cancel != nullptr && cancel->IsCancelled()) {
            return result;
        }
        CDDiscInfo info;
        if (!LookupQueryText(passSettings, record.query, observer, cancel, info)) {
            return result;
        }
        if (SaveDiscFile(folder, record.idText, info, kWindowsDiscFileFormat)) {
            ++result.answered;
        }
    }
    result.complete = true;
    observer.ShowAction(ac::FormatText(ac::g_Language.GetString(text::kBatchDone),
                                       {std::to_string(result.answered)}));
    return result;
}

}  // namespace cddb
