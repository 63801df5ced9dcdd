#include "tools/image/record_version.h"

#include "engine/file_version.h"
#include "tools/image/record_text.h"

namespace image {

std::string DescribeVersion(const FileRecord& record) {
  const int16_t fields[] = {record.versionFirst, record.versionSecond, record.versionThird};
  std::string text;
  for (const int16_t field : fields) {
    if (!text.empty()) text += '.';
    text += field == kVersionNotSet ? "-" : std::to_string(field);
  }
  return text;
}

int CompareVersions(const FileRecord& packaged, const FileRecord& installed) {
  // Names are compared too, and must be there.
  FileRecord first = packaged;
  FileRecord second = installed;
  for (FileRecord* record : {&first, &second}) (void)SetFieldText(record->fileName, "same");
  switch (CompareFileRecords(&first, &second)) {
    case ComparisonFirstGreater:
    case ComparisonSecondGreater:
    case ComparisonThirdGreater:
      return 1;
    case ComparisonFirstSmaller:
    case ComparisonSecondSmaller:
    case ComparisonThirdSmaller:
      return -1;
    default:
      return 0;
  }
}

}  // namespace image
