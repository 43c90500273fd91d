// The rip panel's CDDB commands: a lookup of the disc in the drive, and the batch query of the
// discs whose lookup went unanswered.
#include "cddb/BatchFile.h"
#include "cddb/CddbTexts.h"
#include "cddb/DiscFile.h"
#include "cddb/ui/CddbWaitDlg.h"
#include "platform/AtomicFile.h"
#include "platform/Paths.h"
#include "resources/Language.h"
#include "rip/TrackTable.h"
#include "rip/ui/RipPanel.h"
#include "shell/AppConfig.h"
#include "skin/SkinControls.h"

#include <wx/textctrl.h>

#include <algorithm>

namespace ac {

cddb::LookupSettings CDRipDlg::ReadLookupSettings() const {
    AppConfig& config = GetAppConfig();
    cddb::LookupSettings settings;
    settings.host = cddb::ParseHostSetting(config.GetString("remotecddb"));
    settings.timeoutMs = static_cast<unsigned>(std::max(1, config.GetInt("timeout"))) * 1000;
    settings.email = config.GetString("cddb_email");
    settings.protocolLevel = config.GetInt("cddb_proto");
    platform::EnsureDirectory(m_cddbFolder, 0777);
    settings.batchFile = cddb::BatchFilePath(m_cddbFolder);
    return settings;
}

void CDRipDlg::LookupThread() {
    if (m_lookupOpen || m_currentDrive < 0 || m_currentDrive >= static_cast<int>(m_drives.size()))
        return;
    // Names typed into the list would be replaced by the server's.
    if (m_renamed && (m_modeHost == nullptr ||
                      !m_modeHost->AskYesNo(g_Language.GetString(cddb::text::kRenamedQuestion)))) {
        return;
    }
    LookupJob job;
    job.settings = ReadLookupSettings();
    job.readToc = [device = m_device.get(),
                   drive = m_drives[std::size_t(m_currentDrive)]](cddb::DiscToc& toc) {
        platform::DiscTable table;
        if (!device->ReadToc(drive, table))
            return false;
        toc = ToDiscToc(table);
        return !toc.empty();
    };
    m_lookupOpen = true;
    UpdateButtons();
    cddb::CDDiscInfo record;
    RunLookupDialog(this, std::move(job), record);
    m_lookupOpen = false;
    UpdateButtons();
    if (record.trackCount <= 0) {
        // A failed or cancelled lookup names nothing and writes nothing; an older record stays.
        m_record.artist = g_Language.GetString(cddb::text::kUnknownArtist);
        m_record.album = g_Language.GetString(cddb::text::kUnknownAlbum);
        m_record.Fit();
        m_boxes[0]->ChangeValue(wxString::FromUTF8(m_record.artist));
        m_boxes[1]->ChangeValue(wxString::FromUTF8(m_record.album));
        return;
    }
    if (record.genre.empty())
        record.genre = "Other";
    ApplyRecord(record);
    m_renamed = false;
    if (m_discId != kNoDiscId) {
        cddb::SaveDiscFile(m_cddbFolder, cddb::FormatDiscId(m_discId), m_record,
                           GetAppConfig().GetInt("format"));
    }
}

void CDRipDlg::OnBatchQuery() {
    if (m_lookupOpen)
        return;
    LookupJob job;
    job.settings = ReadLookupSettings();
    job.batchFolder = m_cddbFolder;
    std::string text;
    // A file that cannot be read leaves batch mode off: the dialog then looks up nothing.
    if (platform::ReadWholeFile(job.settings.batchFile, text, cddb::kMaxBatchFileBytes) !=
        platform::ReadResult::Ok) {
        text.clear();
    }
    job.batchMode = true;
    job.batchText = std::move(text);
    m_lookupOpen = true;
    UpdateButtons();
    cddb::CDDiscInfo discarded;
    RunLookupDialog(this, std::move(job), discarded);
    m_lookupOpen = false;
    UpdateButtons();
}

}  // namespace ac
