#include "ui/catalog.h"

#include "package/paths.h"

void LoadCatalogText(const SetupContext* context, uint32_t id, char* buffer, size_t size) {
  const int32_t language = context != nullptr ? context->currentLanguage : kLanguageEnglish;
  LoadCatalogTextIn(language, id, buffer, size);
}

void LoadCatalogTextIn(int32_t language, uint32_t id, char* buffer, size_t size) {
  if (buffer == nullptr || size == 0) return;
  if (language == kLanguageNone) language = SystemLanguage();
  // String ids have 16 bits; the system would take a greater one modulo 65536 and find a row of
  // another language.
  const int64_t fullId = int64_t{id} + language;
  const bool isRow = fullId >= 0 && fullId <= UINT16_MAX;
  if (!isRow ||
      LoadStringA(ModuleHandle(), static_cast<UINT>(fullId), buffer, static_cast<int>(size)) == 0) {
    buffer[0] = '\0';
  }
}

int32_t SystemLanguage() {
  constexpr LANGID kPrimaryLanguageMask = 0x3FF;
  switch (GetSystemDefaultLangID() & kPrimaryLanguageMask) {
    case 7:
      return kLanguageGerman;
    case 9:
      return kLanguageEnglish;
    case 10:
      return kLanguageSpanish;
    case 16:
      return kLanguageItalian;
    default:
      return kLanguageFrench;
  }
}
