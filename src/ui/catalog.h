// The message catalog: string resources of the program, found by a catalog id plus the number of
// the language. Names of files and keys are the same for everybody: they stand at number 0 alone
// and are looked up without a context.
#pragma once

#include "core/context.h"

enum CatalogId : uint32_t {
  CatalogInstallBegins = 100,
  CatalogUpdateBegins = 101,
  CatalogSameVersion = 102,
  CatalogWelcome = 103,
  CatalogCopyingFile = 104,
  CatalogUpdatingFile = 105,
  CatalogRegistering = 106,
  CatalogCancel = 108,
  CatalogEnd = 109,
  CatalogInstall = 110,
  CatalogInstallDone = 111,
  CatalogDefaultDirectory = 113,
  CatalogPickerPrompt = 114,
  CatalogUninstallKey = 115,  // without a context
  CatalogDisplayName = 116,
  CatalogRemovalProgram = 117,  // without a context
  CatalogDeletingFile = 118,
  CatalogRemovalDone = 119,
  CatalogRemove = 120,
  CatalogInstallTitle = 121,
  CatalogRemovalTitle = 122,
  CatalogHelp = 123,
  CatalogHelpCaption = 124,
  CatalogUpdate = 125,
  CatalogBanner = 126,
  CatalogShownAddress = 127,
  CatalogOpenedAddress = 128,
  CatalogConfirmRemoval = 129,
  CatalogOlderVersion = 130,
  CatalogOlderVersionInUse = 131,
  CatalogSameVersionInUse = 132,
  CatalogUpdateDone = 134,
  CatalogLanguageLabel = 135,
  CatalogDetails = 136,
  CatalogLogName = 137,  // without a context
  CatalogConfirmCancel = 138,
  CatalogConfirmCancelCaption = 139,
  CatalogSpaceNeeded = 140,
  CatalogSpaceOccupied = 141,
  CatalogUnit = 142,
  CatalogLanguageCount = 510,      // without a context
  CatalogFirstLanguageName = 600,  // without a context; the others follow
  CatalogNoSpaceChooseOther = 1018,
  CatalogNoSpace = 1019,
};

// Room for a title, a caption, a label or a help text; the message area takes twice as much.
inline constexpr size_t kCatalogTextSize = 500;
inline constexpr size_t kMessageTextSize = 1000;

// Loads the text of `id` in the language of the context: the one in force, or the system's when
// none is. Without a context the number of the language is 0. A text of `size` bytes or more is
// cut; a row that doesn't exist gives an empty text. Without a buffer nothing is done.
void LoadCatalogText(const SetupContext* context, uint32_t id, char* buffer, size_t size);
template <size_t N>
void LoadCatalogText(const SetupContext* context, uint32_t id, char (&buffer)[N]) {
  LoadCatalogText(context, id, buffer, N);
}

// The same in a language given by its number; the system's for kLanguageNone.
void LoadCatalogTextIn(int32_t language, uint32_t id, char* buffer, size_t size);

// The system's language as a kLanguage value; French when it is none of the five.
int32_t SystemLanguage();
