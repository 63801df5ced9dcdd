#include "engine/file_version.h"

#include <cstring>
#include <memory>
#include <new>

#include "engine/version_library.h"
#include "package/data_file.h"
#include "package/package_reader.h"
#include "platform/text.h"

namespace {

// The version data of a file, in a movable block of memory, locked as long as the object lives.
class VersionData {
 public:
  VersionData(const VersionLibrary& library, const char* path) : library_(library) {
    DWORD handle = 0;
    const DWORD size = library.getSize(path, &handle);
    if (size == 0) return;
    block_ = GlobalAlloc(GMEM_MOVEABLE, size);
    if (block_ == nullptr) return;
    data_ = GlobalLock(block_);
    if (data_ == nullptr) return;
    // A read that fails ends in queries that fail, on a block that is at least cleared.
    memset(data_, 0, size);
    (void)library.getInfo(path, handle, size, data_);
  }
  ~VersionData() {
    if (data_ != nullptr) GlobalUnlock(block_);
    if (block_ != nullptr) GlobalFree(block_);
  }
  VersionData(const VersionData&) = delete;
  VersionData& operator=(const VersionData&) = delete;

  // The bytes of a value, valid as long as this object; null when there is none.
  const void* Query(const char* path, UINT* length) const {
    void* value = nullptr;
    *length = 0;
    if (data_ == nullptr || library_.query(data_, path, &value, length) != 1) return nullptr;
    return *length != 0 ? value : nullptr;
  }

 private:
  const VersionLibrary& library_;
  HGLOBAL block_ = nullptr;
  void* data_ = nullptr;
};

constexpr char kSeparators[] = ".,- ";
constexpr size_t kTokenSize = 16;

// White space, a sign, and digits up to the first other character; the low 16 bits of the number.
// 15 digits fit 64 bits.
int16_t TokenValue(const char* token) {
  token += strspn(token, "\t\n\v\f\r");
  if (*token == '+') ++token;  // a '-' has closed the token
  int64_t value = 0;
  for (; *token >= '0' && *token <= '9'; ++token) value = value * 10 + (*token - '0');
  return static_cast<int16_t>(value);
}

// As ParseVersionText, for a text that ends at its NUL or after `size` bytes; as much of it counts
// as a path has room for.
StatusCode ParseVersion(const char* text, size_t size, int16_t* fields) {
  for (int i = 0; i < 3; ++i) fields[i] = kVersionNotSet;
  if (size == 0 || *text == '\0') return StatusNoVersion;

  int16_t numbers[3] = {kVersionNotSet, kVersionNotSet, kVersionNotSet};
  char token[kTokenSize] = {};
  size_t length = 0;
  const size_t counted = size < kPathSize - 1 ? size : kPathSize - 1;
  for (const char* const end = text + counted; text != end && *text != '\0'; ++text) {
    if (strchr(kSeparators, *text) == nullptr) {
      if (length < kTokenSize - 1) token[length++] = *text;
      continue;
    }
    const int free = numbers[0] == kVersionNotSet ? 0 : numbers[1] == kVersionNotSet ? 1 : 2;
    numbers[free] = TokenValue(token);
    memset(token, 0, sizeof(token));
    length = 0;
  }
  if (numbers[2] == kVersionNotSet) numbers[2] = TokenValue(token);
  for (int i = 0; i < 3; ++i) fields[i] = numbers[i] == kVersionNotSet ? int16_t{0} : numbers[i];
  return StatusOk;
}

void ReadVersion(const VersionData& data, FileRecord* record) {
  constexpr char kUsualBlock[] = "040C04B0";  // of a file that has no translation table
  char block[64] = {};
  UINT length = 0;
  const void* translation = data.Query("\\VarFileInfo\\Translation", &length);
  if (translation != nullptr && length >= 2 * sizeof(uint16_t)) {
    uint16_t pair[2];  // language, code page
    memcpy(pair, translation, sizeof(pair));
    (void)FormatText(record->versionLanguage, sizeof(record->versionLanguage), "%04x%04x", pair[0],
                     pair[1]);
    (void)FormatText(block, sizeof(block), "\\StringFileInfo\\%s\\FileVersion",
                     record->versionLanguage);
  } else {
    (void)FormatText(block, sizeof(block), "\\StringFileInfo\\%s\\FileVersion", kUsualBlock);
  }

  const void* version = data.Query(block, &length);
  if (version == nullptr) return;
  int16_t fields[3];
  // Unread: an empty text gives three numbers that aren't set, as the record has them already.
  (void)ParseVersion(static_cast<const char*>(version), length, fields);
  record->versionFirst = fields[0];
  record->versionSecond = fields[1];
  record->versionThird = fields[2];
}

}  // namespace

int32_t ReadFileRecordFromDisk(const char* path, FileRecord* record) {
  if (IsMissingOrEmpty(path) || record == nullptr) return StatusBadArgument;
  *record = {};
  record->recordSize = sizeof(FileRecord);
  record->versionFirst = kVersionNotSet;
  record->versionSecond = kVersionNotSet;
  record->versionThird = kVersionNotSet;
  const std::unique_ptr<DataFile> file(new (std::nothrow) DataFile(path));
  if (file != nullptr) record->fileSize = file->GetSize();

  const VersionLibrary library;
  if (library.IsLoaded()) ReadVersion(VersionData(library, path), record);
  return record->versionLanguage[0] != '\0' && record->versionFirst != kVersionNotSet &&
         record->versionSecond != kVersionNotSet && record->versionThird != kVersionNotSet;
}

int32_t ReadOwnFileRecord(FileRecord* record) {
  char path[kPathSize] = {};
  const StatusCode status = GetImagePath(path, sizeof(path));
  return status == StatusOk ? ReadFileRecordFromDisk(path, record) : status;
}

StatusCode ParseVersionText(const char* text, int16_t* fields) {
  if (text == nullptr || fields == nullptr) return StatusBadArgument;
  return ParseVersion(text, strlen(text), fields);
}

RecordComparison CompareFileRecords(const FileRecord* a, const FileRecord* b) {
  if (a == nullptr || b == nullptr || a->fileName[0] == '\0' || b->fileName[0] == '\0') {
    return ComparisonNoName;
  }
  if (strncmp(a->fileName, b->fileName, sizeof(a->fileName)) != 0) return ComparisonOtherName;
  if (a->versionFirst != b->versionFirst) {
    return a->versionFirst > b->versionFirst ? ComparisonFirstGreater : ComparisonFirstSmaller;
  }
  if (a->versionSecond != b->versionSecond) {
    return a->versionSecond > b->versionSecond ? ComparisonSecondGreater : ComparisonSecondSmaller;
  }
  if (a->versionThird != b->versionThird) {
    return a->versionThird > b->versionThird ? ComparisonThirdGreater : ComparisonThirdSmaller;
  }
  return ComparisonEqual;
}
