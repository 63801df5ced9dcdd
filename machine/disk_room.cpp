#include "machine/disk_room.h"

#include "machine/machine.h"

namespace machine {
namespace {

// Null for a drive without a limit.
uint64_t* RoomOf(char drive) {
  auto& disks = CurrentSettings().disks;
  const auto disk = disks.find(drive);
  return disk == disks.end() || !disk->second.writable ? nullptr : &*disk->second.writable;
}

}  // namespace

bool TakeRoom(char drive, uint64_t bytes) {
  uint64_t* const room = RoomOf(drive);
  if (room == nullptr) return true;
  if (bytes > *room) return false;
  *room -= bytes;
  return true;
}

void GiveRoomBack(char drive, uint64_t bytes) {
  if (uint64_t* const room = RoomOf(drive)) *room += bytes;
}

}  // namespace machine
