// The two fixed records of a package, as they stand in the image and in memory.
//
// An image is: the executable, bytes 0 to dataOffset; for each file a FileRecord and at once its
// stream of storedSize bytes; one PackageHeader, behind which the file ends. Nothing
// pads or aligns a region, and no index gives a stream's offset. All integers are little-endian,
// as is every machine that the program runs on, so a record is read straight into its struct.
//
// A text is 8-bit and has a NUL and zeros behind it, to the end of its field. A damaged package can
// fill a field to its width: read them through TextField (platform/text.h).
#pragma once

#include <cstddef>
#include <cstdint>

inline constexpr char kPackageMagic[] = "MORIV INSTALL DATA HEADER";

struct PackageHeader {
  uint16_t headerSize;         //   0  always 568
  char magic[26];              //   2  kPackageMagic with its NUL
  uint16_t recordCount;        //  28
  uint16_t removalImageFlag;   //  30  1: every run of this image is a removal
  uint32_t spaceNeeded;        //  32  bytes on the disk that the installed files need
  uint32_t packageLength;      //  36  setup image: dataOffset to the end of the file;
                               //      removal program: recordCount * 696
  uint32_t dataOffset;         //  40  first FileRecord, and length of the executable
  char defaultDirectory[260];  //  44
  int32_t defaultLanguage;     // 304  a language offset, or -1
  uint8_t reserved[260];       // 308  zero
};
static_assert(sizeof(PackageHeader) == 568 && offsetof(PackageHeader, spaceNeeded) == 32 &&
              offsetof(PackageHeader, defaultDirectory) == 44 &&
              offsetof(PackageHeader, defaultLanguage) == 304 &&
              offsetof(PackageHeader, reserved) == 308);
static_assert(sizeof(kPackageMagic) == sizeof(PackageHeader::magic));

struct FileRecord {
  uint16_t recordSize;        //   0  always 696
  char fileName[32];          //   2  last element of every target path
  char destination[260];      //  34  elements separated by ';' (engine/resolver.h)
  char versionLanguage[128];  // 294  translation, 8 lower-case hexadecimal digits
  int16_t versionFirst;       // 422  kVersionNotSet when not known, as the two below
  int16_t versionSecond;      // 424
  int16_t versionThird;       // 426
  uint32_t fileSize;          // 428  bytes of the expanded file
  uint32_t storedSize;        // 432  bytes of the stream behind this record, its magic included;
                              //      0 in a removal program
  uint8_t reserved[260];      // 436  zero
};
static_assert(sizeof(FileRecord) == 696 && offsetof(FileRecord, destination) == 34 &&
              offsetof(FileRecord, versionLanguage) == 294 &&
              offsetof(FileRecord, versionFirst) == 422 && offsetof(FileRecord, fileSize) == 428 &&
              offsetof(FileRecord, storedSize) == 432 && offsetof(FileRecord, reserved) == 436);

inline constexpr int16_t kVersionNotSet = -1;  // 0xFFFF in the record
