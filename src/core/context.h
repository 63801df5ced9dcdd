// All that a run knows: what was asked for, the open package, what has happened; and the operations
// that put the request in order. There is one, on the driver's stack.
#pragma once

#include <cstdint>

#include "core/event_list.h"
#include "core/status.h"
#include "package/package_format.h"
#include "platform/text.h"

class DataFile;

// Bits of the options word.
inline constexpr uint32_t OptionSilent = 1;       // no dialog
inline constexpr uint32_t OptionRemove = 2;       // remove instead of install
inline constexpr uint32_t OptionInteractive = 4;  // a dialog was asked for; nobody reads this bit
inline constexpr uint32_t OptionRegister = 8;     // make, or take back, the uninstall list's entry
inline constexpr uint32_t OptionHelp = 16;        // show the help and stop
inline constexpr uint32_t kDefaultOptions = OptionInteractive | OptionRegister;

// A language is the number that is added to a catalog id; the program has no other language
// identifier.
inline constexpr int32_t kLanguageEnglish = 0;
inline constexpr int32_t kLanguageFrench = 10000;
inline constexpr int32_t kLanguageGerman = 20000;
inline constexpr int32_t kLanguageItalian = 30000;
inline constexpr int32_t kLanguageSpanish = 40000;
inline constexpr int32_t kLanguageNone = -1;  // none was asked for

// What the command line asks for, and what the registry holds of an installed product.
struct SetupRequest {
  uint16_t productFound;       // 1: an installed product was found
  uint32_t options;            // Option bits
  int32_t language;            // kLanguage value
  char installDir[kPathSize];  // NUL-terminated
  char reportFile[kPathSize];  // second copy of the log; empty when none
};

// A run. The request is its head. CloseSetup (package/package_reader.h) ends it.
struct SetupContext : SetupRequest {
  DataFile* packageFile;  // the image, open for reading; owned; null while the package is closed
  // Read from the tail of the image. defaultLanguage then becomes the run's, and writing the
  // removal program gives it that program's flag and length.
  PackageHeader header;
  FileRecord* records;      // header.recordCount elements after an install pass; owned
  int32_t currentLanguage;  // language in force
  uint32_t messageId;       // catalog id of the text in the dialog's message area
  int32_t result;           // StatusCode with which the dialog ends
  EventList events;
};

// All return 1, or StatusBadArgument for a null argument.

// A word of 0 becomes kDefaultOptions; any other word stays.
StatusCode ApplyDefaultOptions(uint32_t* options);

// Any value but the five language offsets becomes kLanguageNone.
StatusCode ValidateLanguage(int32_t* language);

// Makes the run of a removal program a removal. Needs the header.
StatusCode ApplyImageKind(SetupContext* context);
