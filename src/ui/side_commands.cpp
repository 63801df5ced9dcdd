#include "ui/side_commands.h"

#include "core/hooks.h"
#include "log/event_log.h"
#include "platform/registry_key.h"
#include "ui/catalog.h"
#include "ui/control_ids.h"
#include "ui/dialog_controls.h"

namespace {

// A quoted "%1" and the like become blanks, both characters. A "%" at the very end is one blank.
void BlankParameters(char* text) {
  for (; *text != '\0'; ++text) {
    if (*text != '%') continue;
    *text = ' ';
    if (text[1] != '\0') *++text = ' ';
  }
}

void StartCommand(char* commandLine) {
  STARTUPINFOA startup = {};
  startup.cb = sizeof(startup);
  startup.dwFlags = STARTF_USESHOWWINDOW;
  startup.wShowWindow = SW_SHOW;
  PROCESS_INFORMATION process = {};
  if (CreateProcessA(nullptr, commandLine, nullptr, nullptr, FALSE, 0, nullptr, nullptr, &startup,
                     &process) == FALSE) {
    return;
  }
  CloseHandle(process.hThread);
  CloseHandle(process.hProcess);
}

// The path behind the picker's answer, which is given back.
bool TakePickedPath(LPITEMIDLIST list, char (&path)[kPathSize]) {
  const bool isPath = SHGetPathFromIDListA(list, path) == TRUE;
  IMalloc* allocator = nullptr;
  if (SHGetMalloc(&allocator) == S_OK) {
    allocator->Free(list);
    allocator->Release();
  }
  return isPath;
}

}  // namespace

void BrowseForDirectory(SetupContext* context) {
  char prompt[kPathSize] = {};
  char displayName[kPathSize] = {};
  LoadCatalogText(context, CatalogPickerPrompt, prompt);
  BROWSEINFOA browse = {};
  browse.hwndOwner = wizardState.window;
  browse.pszDisplayName = displayName;
  browse.lpszTitle = prompt;
  const LPITEMIDLIST list = SHBrowseForFolderA(&browse);
  if (list == nullptr) return;
  char path[kPathSize] = {};
  if (!TakePickedPath(list, path)) return;
  SendMessageA(Control(IDC_DIRECTORY), WM_SETTEXT, 0, reinterpret_cast<LPARAM>(path));
  if (context != nullptr) (void)CopyText(context->installDir, path);  // the same size
}

void OpenWebAddress(SetupContext* context) {
  char command[kPathSize] = {};
  char address[kPathSize] = {};
  if (ReadBrowserCommand(command, sizeof(command)) != 1) return;
  (void)RemoveCharacter(command, '"', '\0');
  if (command[0] == '\0') return;
  BlankParameters(command);
  LoadCatalogText(context, CatalogOpenedAddress, address);
  if (AppendText(command, address)) StartCommand(command);
}

void OpenLogFile(SetupContext*) {
  char path[kLogPathSize] = {};
  if (FindLogPath(path)) ShellExecuteA(wizardState.window, "Open", path, nullptr, nullptr, SW_SHOW);
}

int ReadBrowserCommand(char* buffer, size_t size) {
  if (buffer == nullptr || size == 0) return 0;
  RegistryKey key;
  if (!key.Open(HKEY_CLASSES_ROOT, "http\\shell\\open\\command", KEY_READ) &&
      !key.Open(HKEY_CLASSES_ROOT, "htmlfile\\shell\\open\\command", KEY_READ)) {
    return 0;
  }
  LONG count = static_cast<LONG>(size);
  if (RegQueryValueA(key.get(), nullptr, buffer, &count) != ERROR_SUCCESS) return 0;
  // A value that fills the buffer without a NUL is too long.
  return memchr(buffer, '\0', size) != nullptr ? 1 : 0;
}

int RemoveCharacter(char* text, char character, char replacement) {
  if (text == nullptr) return -1;
  char* kept = text;
  for (const char* next = text; *next != '\0'; ++next) {
    if (*next != character) {
      *kept++ = *next;
    } else if (replacement != '\0') {
      *kept++ = replacement;
    }
  }
  *kept = '\0';
  return 1;
}
