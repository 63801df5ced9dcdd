#include "core/run_settings.h"

#include "package/package_reader.h"
#include "package/paths.h"
#include "platform/procedure.h"
#include "platform/text.h"
#include "registration/registered_product.h"
#include "ui/catalog.h"

namespace {

// Asks the function that knows of quotas and of disks above 2 GB, where the system has it.
bool AskExtendedFreeSpace(HMODULE kernel, const char* root, uint64_t* bytes) {
  const auto getFreeSpace =
      FindProcedure<decltype(&GetDiskFreeSpaceExA)>(kernel, "GetDiskFreeSpaceExA");
  ULARGE_INTEGER freeToCaller = {};
  ULARGE_INTEGER total = {};
  ULARGE_INTEGER freeBytes = {};
  if (getFreeSpace == nullptr || getFreeSpace(root, &freeToCaller, &total, &freeBytes) != TRUE) {
    return false;
  }
  *bytes = freeToCaller.QuadPart;
  return true;
}

bool AskFreeClusters(const char* root, uint64_t* bytes) {
  DWORD sectorsPerCluster = 0;
  DWORD bytesPerSector = 0;
  DWORD freeClusters = 0;
  DWORD totalClusters = 0;
  if (GetDiskFreeSpaceA(root, &sectorsPerCluster, &bytesPerSector, &freeClusters, &totalClusters) ==
      FALSE) {
    return false;
  }
  *bytes = uint64_t{sectorsPerCluster} * bytesPerSector * freeClusters;
  return true;
}

// The language to take when the command line gave none: the registered product's, else the
// package's, else the system's.
int32_t FindLanguage(const SetupContext& context) {
  SetupRequest registered = {};
  if (ReadRegisteredProduct(&registered) == 1 && registered.language != kLanguageNone) {
    return registered.language;
  }
  return context.header.defaultLanguage != kLanguageNone ? context.header.defaultLanguage
                                                         : SystemLanguage();
}

}  // namespace

StatusCode ChooseLanguage(SetupContext* context) {
  if (context == nullptr) return StatusBadArgument;
  if (context->language == kLanguageNone) context->language = FindLanguage(*context);
  context->header.defaultLanguage = context->language;
  context->currentLanguage = context->language;
  return StatusOk;
}

StatusCode FindInstalledProduct(SetupContext* context) {
  if (context == nullptr) return StatusBadArgument;
  SetupRequest registered = {};
  context->productFound = ReadRegisteredProduct(&registered) == 1;
  if (context->productFound == 1) {
    (void)CopyText(context->installDir, registered.installDir);  // the same size
    Inform(&context->events, EventFoundRegistered);
    return StatusOk;
  }

  char directory[kPathSize] = {};
  (void)CopyText(directory, context->installDir);
  const bool exists = DirectoryExists(directory) == 1 ||
                      (GetDefaultInstallDir(context, directory, sizeof(directory)) == 1 &&
                       DirectoryExists(directory) == 1);
  if (!exists) return StatusOk;
  context->productFound = 1;
  (void)CopyText(context->installDir, directory);
  Inform(&context->events, EventFoundDirectory);
  return StatusOk;
}

StatusCode ChooseInstallDir(const SetupContext* context, char* directory, size_t size,
                            const char* defaultDirectory) {
  if (directory == nullptr || size == 0) return StatusBadArgument;
  if (IsValidPath(directory) == 1) return StatusOk;
  if (!IsMissingOrEmpty(defaultDirectory) && CopyText(directory, size, defaultDirectory)) {
    return StatusOk;
  }
  const int status = GetDefaultInstallDir(context, directory, size);
  if (status != 1) return status;
  return IsValidPath(directory) == 1 ? StatusOk : StatusBadDirectory;
}

int GetDefaultInstallDir(const SetupContext* context, char* buffer, size_t size) {
  if (buffer == nullptr) return -1;
  char text[kCatalogTextSize] = {};
  LoadCatalogText(context, CatalogDefaultDirectory, text);
  return CopyText(buffer, size, text) ? 1 : -1;
}

StatusCode CheckDiskSpace(const SetupContext* context) {
  if (context == nullptr) return StatusBadArgument;
  uint64_t freeBytes = 0;
  if (!GetFreeDiskSpace(context->installDir, &freeBytes)) return StatusOk;
  return context->header.spaceNeeded <= freeBytes ? StatusOk : StatusNoDiskSpace;
}

bool GetFreeDiskSpace(const char* path, uint64_t* bytes) {
  char root[kPathSize] = {};
  const char* const backslash = path != nullptr ? strchr(path, '\\') : nullptr;
  if (backslash == nullptr) return false;
  const size_t length = static_cast<size_t>(backslash - path);
  if (length >= sizeof(root)) return false;
  memcpy(root, path, length);

  const HMODULE kernel = LoadLibraryA("KERNEL32.DLL");
  if (kernel == nullptr) return false;
  const bool isKnown = AskExtendedFreeSpace(kernel, root, bytes);
  FreeLibrary(kernel);
  return isKnown || AskFreeClusters(root, bytes);
}

uint32_t GetNeededSpace(SetupContext* context) {
  if (context == nullptr) return 0;
  if (context->packageFile != nullptr) return context->header.spaceNeeded;
  const bool isOpen = OpenPackage(context) == StatusOk;
  const uint32_t needed = isOpen ? context->header.spaceNeeded : 0;
  (void)CloseSetup(context);
  return needed;
}

int IsValidPath(char* path) {
  if (IsMissingOrEmpty(path)) return 0;
  CutTrailingBlanks(path);
  const char* const colon = strchr(path, ':');
  if (colon == nullptr) return 1;
  for (const char* rest = colon + 1; *rest != '\0'; ++rest) {
    if (CharInSet(*rest, "/:*?\"<>|") == 1) return 0;
  }
  return 1;
}

int CharInSet(char character, const char* set) {
  if (character == '\0' || IsMissingOrEmpty(set)) return -1;
  return strchr(set, character) != nullptr ? 1 : 0;
}

int FormatSize(uint32_t bytes, char* buffer, size_t size) {
  constexpr uint32_t kMegabyte = 1048576;
  const uint32_t kilobytesLeft = bytes / 1024 % 1024;
  const uint32_t tenths = kilobytesLeft * 1000 / 1024 / 100;
  char text[32];
  const unsigned long whole = bytes / kMegabyte;
  const bool isFormatted =
      tenths == 0 ? FormatText(text, sizeof(text), "%lu", whole)
                  : FormatText(text, sizeof(text), "%lu,%u", whole, static_cast<unsigned>(tenths));
  return buffer != nullptr && isFormatted && CopyText(buffer, size, text) ? 1 : 0;
}
