// How much can still be written to a drive, for drives whose settings limit it.
#pragma once

#include <cstdint>

namespace machine {

// Takes `bytes` of the drive's room. False, with nothing taken, when they do not fit.
bool TakeRoom(char drive, uint64_t bytes);
void GiveRoomBack(char drive, uint64_t bytes);

}  // namespace machine
