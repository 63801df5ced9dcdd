// One file: its name, and what it is open through.
//
// Every open tries a Win32 handle that shares the file with nobody. Where the system refuses that,
// a descriptor of the C runtime that shares it with everybody comes in its place. The 9x family
// reads a running image only so. Positions and sizes have 32 bits.
//
// Operations answer a count, or 1 and 0; what a failure means to a run is for their callers to say.
#pragma once

#include <cstdint>

#include "platform/win32.h"

class DataFile {
 public:
  // Keeps a copy of the name. A null or empty name, or no memory for the copy, leaves the object
  // nameless: then every open fails.
  explicit DataFile(const char* name);
  ~DataFile();
  DataFile(const DataFile&) = delete;
  DataFile& operator=(const DataFile&) = delete;

  // All three answer 0, and change nothing, on an object that is open already or has no name.
  int OpenForRead();
  int OpenForWrite();  // the file has to exist
  int Create();        // for reading and writing; an existing file is cut to nothing

  // Bytes moved. 0 when that fails, nothing is open, or there is no buffer or nothing to move.
  uint32_t Read(void* buffer, uint32_t count);
  uint32_t Write(const void* buffer, uint32_t count);

  // Size in bytes; 0 on any failure. A closed object looks its name up and stays closed. The
  // position afterwards is of no meaning.
  uint32_t GetSize();

  int SeekTo(int32_t position);  // from the start; refused below 0, with the old position kept
  int SeekToEnd();
  int32_t Tell();  // -1 on failure and on a closed object

  int Close();   // 1 if nothing was open; closed afterwards whatever the system answered
  int Delete();  // closes first; 0 for a nameless object

  // The name, or null. Stays owned by the object.
  const char* GetName() const { return name_; }

 private:
  int Open(DWORD access, DWORD disposition);
  int OpenDescriptor(DWORD access, DWORD disposition);

  HANDLE handle_ = INVALID_HANDLE_VALUE;
  int32_t descriptor_ = -1;
  char* name_ = nullptr;  // owned
};
