#include "tools/image/removal_image.h"

#include "tools/image/bad_input.h"
#include "tools/image/executable_part.h"
#include "tools/image/image_contents.h"
#include "tools/image/output_file.h"

namespace image {

void WriteRemovalImage(const std::filesystem::path& image, const std::filesystem::path& output,
                       std::optional<int32_t> language) {
  const InputFile file(image);
  RequireOtherFile(image, output);
  const ImageContents contents = ReadWholeContents(file);
  PackageHeader header = contents.header;
  if (header.removalImageFlag == 1) {
    throw BadInput(image, "is a removal program already; name a setup image");
  }
  RequireVersion(image);

  OutputFile removal(output, FileKind::kProgram);
  CopyExecutable(file, header.dataOffset, &removal);
  for (const PackagedFile& packaged : contents.files) {
    FileRecord record = packaged.record;
    record.storedSize = 0;
    removal.Write(BytesOf(record));
  }
  header.removalImageFlag = 1;
  header.packageLength = static_cast<uint32_t>(contents.files.size() * sizeof(FileRecord));
  header.defaultLanguage = language.value_or(header.defaultLanguage);
  removal.Write(BytesOf(header));
  removal.Commit();
}

}  // namespace image
