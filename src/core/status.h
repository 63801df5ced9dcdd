// What nearly every operation returns: 1 for success; below 0 it gave up; above 100000 it has done
// its work but for a part that can be missing. A run's exit code is one of these, or 0 after the
// help, which is no status.
#pragma once

#include <cstdint>

using StatusCode = int32_t;

inline constexpr StatusCode StatusOk = 1;
inline constexpr StatusCode StatusBadArgument = -1000000;
inline constexpr StatusCode StatusBufferTooSmall = -1000001;
inline constexpr StatusCode StatusDeleteFailed = -1000002;
inline constexpr StatusCode StatusCreateFileFailed = -1000003;
inline constexpr StatusCode StatusWriteRemovalFailed = -1000004;
inline constexpr StatusCode StatusInternal = -1000005;
inline constexpr StatusCode StatusCreateDirFailed = -1000006;
inline constexpr StatusCode StatusBadDirectory = -1000007;
inline constexpr StatusCode StatusNoSystemDir = -1000008;
inline constexpr StatusCode StatusBadRecord = -1000009;
inline constexpr StatusCode StatusCancelled = -1000010;
inline constexpr StatusCode StatusDialogAborted = -1000011;
inline constexpr StatusCode StatusBadPackage = -1000012;
inline constexpr StatusCode StatusNoMemory = -1000013;
inline constexpr StatusCode StatusOpenFailed = -1000014;
inline constexpr StatusCode StatusReadFailed = -1000015;
inline constexpr StatusCode StatusExpandFailed = -1000016;
inline constexpr StatusCode StatusSeekFailed = -1000017;
inline constexpr StatusCode StatusServicesRemain = -1000018;
inline constexpr StatusCode StatusNoModulePath = -1000019;
inline constexpr StatusCode StatusNoDiskSpace = -1000020;
inline constexpr StatusCode StatusCopyFailed = -1000021;
inline constexpr StatusCode StatusNoVersion = 100001;
inline constexpr StatusCode StatusRemovalProgramFailed = 100002;
// 100003 is not in use.
inline constexpr StatusCode StatusNotRegistered = 100004;
inline constexpr StatusCode StatusNoNetscape = 100005;
inline constexpr StatusCode StatusNoExplorer = 100006;
inline constexpr StatusCode StatusNoOpera = 100007;

// A browser that a destination asks for is not on this machine: the file is skipped for it.
constexpr bool IsMissingBrowser(StatusCode code) {
  return code == StatusNoNetscape || code == StatusNoExplorer || code == StatusNoOpera;
}

// Catalog id of the message that tells the user of this code; 1000, the general one, for every code
// without a message of its own.
uint32_t MessageForStatus(StatusCode code);
