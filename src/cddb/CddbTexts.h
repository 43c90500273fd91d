#pragma once
// Ids of the CDDB texts in the language files: the client's failure texts, the lookup's
// actions and answers, the dialogs' own words.

#include <cstdint>

namespace cddb::text {

inline constexpr std::uint32_t kQuerySocketFailed = 0xC1C0;
inline constexpr std::uint32_t kReadSocketFailed = 0xC1C1;
inline constexpr std::uint32_t kConnectFailed = 0xC1C2;
inline constexpr std::uint32_t kQuerySendFailed = 0xC1C3;
inline constexpr std::uint32_t kReadSendFailed = 0xC1C4;
inline constexpr std::uint32_t kTimeOut = 0xC1C5;
inline constexpr std::uint32_t kQueryNoReply = 0xC1C6;
inline constexpr std::uint32_t kReadNoReply = 0xC1C7;
inline constexpr std::uint32_t kQueryAction = 0xC1C8;
inline constexpr std::uint32_t kReadAction = 0xC1C9;
inline constexpr std::uint32_t kRenamedQuestion = 0xC1CA;
inline constexpr std::uint32_t kUnknownArtist = 0xC1CB;
inline constexpr std::uint32_t kUnknownAlbum = 0xC1CC;
inline constexpr std::uint32_t kBatchDone = 0xC1CD;

// The server address dialog.
inline constexpr std::uint32_t kServerTitle = 286;
inline constexpr std::uint32_t kServers = 287;
inline constexpr std::uint32_t kAddress = 288;
inline constexpr std::uint32_t kPort = 289;
inline constexpr std::uint32_t kAdd = 290;
inline constexpr std::uint32_t kDelete = 291;

}  // namespace cddb::text
