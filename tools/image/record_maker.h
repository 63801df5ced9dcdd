// The records of a package, made of its description and of the sources that it names.
#pragma once

#include <cstdint>
#include <vector>

#include "package/package_format.h"
#include "tools/image/package_description.h"

namespace image {

struct PackageRecords {
  std::vector<FileRecord> records;  // complete but for their storedSize
  uint64_t sizes = 0;               // of all files
  uint64_t spaceNeeded = 0;         // the same, each as often as it has places on every machine
};

// Makes a record for each file and a list of all that is wrong with texts and sources. With a fault
// the records are of no use.
//   allowUnknownMacros  lets %...% words pass that are no macro, and lone % signs
//   faults              gets warnings too: of versions that are read in an odd way, and of places
PackageRecords MakeRecords(const PackageDescription& description, bool allowUnknownMacros,
                           FaultList* faults);

}  // namespace image
