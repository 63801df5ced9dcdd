// Versions of files on the disk, from their version resources, and their comparison.
//
// A version has three numbers, the fields of a FileRecord. A number that isn't set is
// kVersionNotSet, which counts below every ordinary one.
#pragma once

#include "core/status.h"
#include "package/package_format.h"

// Fills the record from a file: recordSize, fileSize, storedSize 0, versionLanguage and the
// version; names stay empty. Returns 1 when language and version are complete, 0 when not (the
// fields hold what there was), StatusBadArgument when the path is missing or the record is null.
int32_t ReadFileRecordFromDisk(const char* path, FileRecord* record);

// The same for the running image, or the status of GetImagePath if that isn't 1.
int32_t ReadOwnFileRecord(FileRecord* record);

// Reads a text such as "4.1.7" or "4,1,7,0" into the three `fields`. Every point, comma, hyphen and
// blank closes a number, even an empty one, which is 0; 0 also stands for one that the text lacks.
// Of the text the first 259 characters count, of a number the first 15 and the low 16 bits of its
// value. Returns 1; StatusNoVersion for an empty text, with kVersionNotSet in all three fields;
// StatusBadArgument for a null argument, with the fields untouched.
StatusCode ParseVersionText(const char* text, int16_t* fields);

// Compares names, byte by byte, then versions. The result tells where a differs:
enum RecordComparison {
  ComparisonNoName = 0,  // a pointer is null or a name empty
  ComparisonEqual = 1,
  ComparisonOtherName = 3,
  ComparisonFirstGreater = 4,
  ComparisonSecondGreater = 5,
  ComparisonThirdGreater = 6,
  ComparisonFirstSmaller = 7,
  ComparisonSecondSmaller = 8,
  ComparisonThirdSmaller = 9,
};
RecordComparison CompareFileRecords(const FileRecord* a, const FileRecord* b);
