// The free space of a drive, as its settings tell it. It does not follow what is written.
#include <algorithm>
#include <optional>

#include "machine/drives.h"
#include "machine/faults.h"
#include "machine/machine.h"
#include "platform/win32.h"

using machine::CallFails;

namespace {

constexpr DWORD kBytesPerSector = 512;
constexpr DWORD kSectorsPerCluster = 8;
constexpr uint64_t kBytesPerCluster = uint64_t{kBytesPerSector} * kSectorsPerCluster;

// The caller has a quota: the disk has more bytes free than are free to the caller.
constexpr uint64_t kOthersFreeBytes = uint64_t{1} << 30;
constexpr uint64_t kUsedBytes = uint64_t{4} << 30;

uint64_t AddSaturated(uint64_t a, uint64_t b) {
  return a > UINT64_MAX - b ? UINT64_MAX : a + b;
}

// The drive that a directory lies on; a null text is the current drive. nullopt when there is none.
std::optional<machine::Location> LocateDirectory(LPCSTR directory) {
  const auto location = machine::Locate(directory == nullptr ? "\\" : directory);
  return location && location->isDirectory ? location : std::nullopt;
}

uint64_t FreeToCaller(char drive) {
  const auto& disks = machine::CurrentSettings().disks;
  const auto disk = disks.find(drive);
  return disk == disks.end() ? machine::DiskSettings{}.freeBytes : disk->second.freeBytes;
}

DWORD CountClusters(uint64_t bytes) {
  return static_cast<DWORD>(std::min<uint64_t>(bytes / kBytesPerCluster, UINT32_MAX));
}

}  // namespace

extern "C" {

// Takes a drive's root alone. The oldest systems answer no more than 2 GiB, by which no one is
// served here.
BOOL GetDiskFreeSpaceA(LPCSTR root, LPDWORD sectorsPerCluster, LPDWORD bytesPerSector,
                       LPDWORD freeClusters, LPDWORD totalClusters) {
  if (CallFails("GetDiskFreeSpaceA")) return FALSE;
  const auto location = LocateDirectory(root);
  if (!location || !location->isRoot) return FALSE;
  const uint64_t freeBytes = FreeToCaller(location->drive);
  if (sectorsPerCluster != nullptr) *sectorsPerCluster = kSectorsPerCluster;
  if (bytesPerSector != nullptr) *bytesPerSector = kBytesPerSector;
  if (freeClusters != nullptr) *freeClusters = CountClusters(freeBytes);
  if (totalClusters != nullptr) *totalClusters = CountClusters(AddSaturated(freeBytes, kUsedBytes));
  return TRUE;
}

BOOL GetDiskFreeSpaceExA(LPCSTR root, PULARGE_INTEGER freeToCaller, PULARGE_INTEGER total,
                         PULARGE_INTEGER freeBytes) {
  if (CallFails("GetDiskFreeSpaceExA")) return FALSE;
  const auto location = LocateDirectory(root);
  if (!location) return FALSE;
  const uint64_t callerBytes = FreeToCaller(location->drive);
  const uint64_t allBytes = AddSaturated(callerBytes, kOthersFreeBytes);
  if (freeToCaller != nullptr) freeToCaller->QuadPart = callerBytes;
  if (total != nullptr) total->QuadPart = AddSaturated(allBytes, kUsedBytes);
  if (freeBytes != nullptr) freeBytes->QuadPart = allBytes;
  return TRUE;
}

}  // extern "C"
