#include "registration/registered_product.h"

#include "registration/product_registry.h"

namespace {

constexpr size_t kNamesSize = 520;

// Joins names as long as they fit whole.
void JoinNames(const KeyNameNode* names, char (&joined)[kNamesSize]) {
  for (const KeyNameNode* node = names; node != nullptr; node = node->next) {
    const size_t length = strlen(joined);
    if ((length > 0 && !AppendText(joined, ",")) || !AppendText(joined, node->name)) {
      joined[length] = '\0';
      return;
    }
  }
}

}  // namespace

int ReadRegisteredProduct(SetupRequest* record) {
  if (ProductRootExists(nullptr) != 1) return 0;
  if (record == nullptr) return 1;
  if (ProductGetItem(kItemInstallDir, nullptr, nullptr, record->installDir,
                     sizeof(record->installDir)) == nullptr) {
    return 0;
  }
  record->productFound = 1;
  record->language = LanguageFromRegistry(ProductGetLanguage(nullptr));
  return 1;
}

StatusCode RegisterProduct(const SetupContext* context) {
  if (context == nullptr || context->installDir[0] == '\0') return StatusNotRegistered;
  if (ReadRegisteredProduct(nullptr) == 0 && ProductCreateTree(nullptr) != 1) {
    return StatusNotRegistered;
  }
  if (ProductSetItem(kItemInstallDir, nullptr, nullptr, context->installDir) != 1) {
    return StatusNotRegistered;
  }
  // Unread: a product without a language reads as French.
  (void)ProductSetLanguage(nullptr, LanguageToRegistry(context->language));
  return StatusOk;
}

int UnregisterProduct() {
  (void)ProductDeleteTree(nullptr);  // what the registry keeps, the run can't change
  return 1;
}

int CheckDependingServices(char* buffer, int32_t size) {
  bool isComplete = true;
  KeyNameNode* const services = ProductListServices(&isComplete);
  if (services == nullptr && isComplete) return 1;
  char joined[kNamesSize] = {};
  JoinNames(services, joined);
  ProductFreeList(services);
  if (buffer != nullptr && size > 0) (void)CopyText(buffer, static_cast<size_t>(size), joined);
  return 0;
}

int32_t LanguageFromRegistry(int32_t number) {
  switch (number) {
    case ProductEnglish:
      return kLanguageEnglish;
    case ProductGerman:
      return kLanguageGerman;
    case ProductSpanish:
      return kLanguageSpanish;
    case ProductItalian:
      return kLanguageItalian;
    default:
      return kLanguageFrench;
  }
}

int32_t LanguageToRegistry(int32_t language) {
  switch (language) {
    case kLanguageFrench:
      return ProductFrench;
    case kLanguageGerman:
      return ProductGerman;
    case kLanguageSpanish:
      return ProductSpanish;
    case kLanguageItalian:
      return ProductItalian;
    default:
      return ProductEnglish;
  }
}
