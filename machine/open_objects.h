// The count of what the program holds open, so that a run that leaks is told from one that does
// not.
#pragma once

#include <string>

namespace machine {

enum class ObjectKind {
  kFile,
  kDescriptor,
  kKey,
  kModule,
  kMemoryBlock,
  kBrush,
  kFont,
  kBitmap,
  kDeviceContext,
  kItemList,
  kProcess,
};

void ObjectOpened(ObjectKind kind);
void ObjectClosed(ObjectKind kind);

// "2 files, 1 key", or "" when nothing is open.
std::string OpenObjects();
void ForgetOpenObjects();

}  // namespace machine
