#include "core/context.h"

StatusCode ApplyDefaultOptions(uint32_t* options) {
  if (options == nullptr) return StatusBadArgument;
  if (*options == 0) *options = kDefaultOptions;
  return StatusOk;
}

StatusCode ValidateLanguage(int32_t* language) {
  if (language == nullptr) return StatusBadArgument;
  switch (*language) {
    case kLanguageEnglish:
    case kLanguageFrench:
    case kLanguageGerman:
    case kLanguageItalian:
    case kLanguageSpanish:
      break;
    default:
      *language = kLanguageNone;
  }
  return StatusOk;
}

StatusCode ApplyImageKind(SetupContext* context) {
  if (context == nullptr) return StatusBadArgument;
  if (context->header.removalImageFlag == 1) context->options |= OptionRemove;
  return StatusOk;
}
