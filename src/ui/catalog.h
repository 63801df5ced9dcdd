// The message catalog: string resources of the program, found by a catalog id plus the number of
// the language. A few names that must not change with the language (the log's, the removal
// program's) stand at number 0 alone and are looked up without a context.
#pragma once

#include "core/context.h"

enum CatalogId : uint32_t {
  CatalogFileCopied = 104,
  CatalogFileUpdated = 105,
  CatalogDefaultDirectory = 113,
  CatalogUninstallKey = 115,  // without a context
  CatalogDisplayName = 116,
  CatalogRemovalProgram = 117,  // without a context
  CatalogDeletingFile = 118,
  CatalogHelp = 123,
  CatalogHelpCaption = 124,
  CatalogLogName = 137,  // without a context
  CatalogUnit = 142,
};

// Room for a title, a caption, a label or a help text; the message area takes twice as much.
inline constexpr size_t kCatalogTextSize = 500;
inline constexpr size_t kMessageTextSize = 1000;

// Loads the text of `id` in the language of the context: the one in force, or the system's when
// none is. Without a context the number of the language is 0. A text of `size` bytes or more is
// cut; a row that doesn't exist gives an empty text. Does nothing for a null buffer or a size of 0.
void LoadCatalogText(const SetupContext* context, uint32_t id, char* buffer, size_t size);
template <size_t N>
void LoadCatalogText(const SetupContext* context, uint32_t id, char (&buffer)[N]) {
  LoadCatalogText(context, id, buffer, N);
}

// The system's language as a kLanguage value; French when it is none of the five.
int32_t SystemLanguage();
