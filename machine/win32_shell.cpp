// The shell and other programs: what the program asks for is told to the user, and nothing runs.
#include <cstring>
#include <set>
#include <string>

#include "machine/drives.h"
#include "machine/faults.h"
#include "machine/open_objects.h"
#include "machine/process_handles.h"
#include "machine/scripted_user.h"
#include "platform/win32.h"

using machine::CallFails;
using machine::ObjectKind;

// What the folder picker answers with: opaque to the program, which gives it back to the allocator.
struct ITEMIDLIST {
  std::string path;
};

namespace {

std::set<ITEMIDLIST*> itemLists;

class Allocator : public IMalloc {
 public:
  ULONG Release() override { return 1; }  // the shell's own lives on

  void Free(void* block) override {
    auto* const list = static_cast<ITEMIDLIST*>(block);
    if (itemLists.erase(list) == 0) return;
    machine::ObjectClosed(ObjectKind::kItemList);
    delete list;
  }

  virtual ~Allocator() = default;
};

bool IsProgram(std::string path) {
  const size_t name = path.find_last_of("\\/:") + 1;
  if (path.find('.', name) == std::string::npos) path += ".exe";
  return machine::LocateFile(path).has_value();
}

// A command line begins with its program, in quotes or up to the first blank that makes it one.
// Windows also searches directories for a name without a path.
bool BeginsWithAProgram(const std::string& line) {
  if (line.starts_with('"')) return IsProgram(line.substr(1, line.find('"', 1) - 1));
  size_t end = line.find(' ');
  while (end != std::string::npos && !IsProgram(line.substr(0, end))) end = line.find(' ', end + 1);
  return end != std::string::npos || IsProgram(line);
}

}  // namespace

extern "C" {

// The answer is a number above 32 for success.
HINSTANCE ShellExecuteA(HWND, LPCSTR, LPCSTR file, LPCSTR, LPCSTR, int) {
  constexpr uintptr_t kFileNotFound = 2;
  constexpr uintptr_t kStarted = 33;
  if (CallFails("ShellExecuteA") || file == nullptr) {
    return reinterpret_cast<HINSTANCE>(kFileNotFound);
  }
  machine::TellUser("open " + machine::Quoted(file));
  return reinterpret_cast<HINSTANCE>(machine::LocateFile(file) ? kStarted : kFileNotFound);
}

// A program that is there starts, as far as the caller can see: it gets the two handles, which it
// has to close.
BOOL CreateProcessA(LPCSTR, LPSTR commandLine, LPSECURITY_ATTRIBUTES, LPSECURITY_ATTRIBUTES, BOOL,
                    DWORD, LPVOID, LPCSTR, STARTUPINFOA* startup,
                    PROCESS_INFORMATION* information) {
  if (CallFails("CreateProcessA") || commandLine == nullptr || information == nullptr) return FALSE;
  if (startup == nullptr || startup->cb != sizeof(STARTUPINFOA)) return FALSE;
  machine::TellUser("start " + machine::Quoted(commandLine));
  if (!BeginsWithAProgram(commandLine)) return FALSE;
  *information = {};
  information->hProcess = machine::OpenProcessHandle();
  information->hThread = machine::OpenProcessHandle();
  return TRUE;
}

LPITEMIDLIST SHBrowseForFolderA(BROWSEINFOA* info) {
  if (CallFails("SHBrowseForFolderA") || info == nullptr) return nullptr;
  std::string path;
  if (!machine::PickFolder(info->lpszTitle != nullptr ? info->lpszTitle : "", &path)) {
    return nullptr;
  }
  auto* const list = new ITEMIDLIST{path};
  itemLists.insert(list);
  machine::ObjectOpened(ObjectKind::kItemList);
  return list;
}

BOOL SHGetPathFromIDListA(LPCITEMIDLIST list, LPSTR path) {
  if (CallFails("SHGetPathFromIDListA") || list == nullptr || path == nullptr) return FALSE;
  if (list->path.size() >= MAX_PATH) return FALSE;
  std::memcpy(path, list->path.c_str(), list->path.size() + 1);
  return TRUE;
}

HRESULT SHGetMalloc(IMalloc** allocator) {
  constexpr HRESULT kFailed = static_cast<HRESULT>(0x80004005);
  if (CallFails("SHGetMalloc") || allocator == nullptr) return kFailed;
  static Allocator shell;
  *allocator = &shell;
  return S_OK;
}

}  // extern "C"
