// The items: which value of which key each number stands for.
#include <cstring>
#include <new>

#include "platform/registry_key.h"
#include "platform/text.h"
#include "registration/product_keys.h"
#include "registration/product_registry.h"

namespace {

struct ItemRow {
  int32_t item;
  const char* name;
};

// The range of a number tells the key that its value lies in.
constexpr ItemRow kItems[] = {
    // Root
    {1, "InstallDir"},
    {2, "Language"},
    {3, "Version"},
    // Service
    {11, "InstallDir"},
    {12, "CdromEdition"},
    {13, "CdromRelease"},
    {14, "CdromIniFile"},
    {15, "CdromPath"},
    {16, "ConfFile"},
    {17, "ExeConfFile"},
    {18, "CacheFile"},
    {19, "Version"},
    {21, "ShortName"},
    {22, "LongName"},
    {23, "MainViewerName"},
    {24, "SmallIcon"},
    {25, "LargeIcon"},
    {26, "Country"},
    {27, "Language"},
    {31, "InstallId"},
    {32, "ServiceActivated"},
    {33, "SaiId"},
    {34, "EnvId"},
    {35, "Connection"},
    {36, "BootIdf"},
    {37, "NavigatorIdf"},
    {38, "LastId"},
    {39, "LastIdKey"},
    {40, "LastIdDate"},
    {51, "CurrentProfile"},
    {52, "HelpProfile"},
    {53, "PopBookFile"},
    {54, "PhonebookName"},
    {55, "PhonebookFile"},
    {56, "Keys"},
    {57, "CompDll"},
    {71, "ContentSound"},
    {72, "InformationSound"},
    {73, "ApplicativeSound"},
    {74, "HelpSound"},
    {75, "EffectSound"},
    {76, "BackgroundSound"},
    // NetProfiles entry
    {101, "NetworkType"},
    {102, "DomainName"},
    {103, "Stats"},
    {104, "ZebAddress"},
    {105, "DnsAddress"},
    {106, "PopAddress"},
    {107, "SmtpAddress"},
    {108, "NewsAddress"},
    {109, "ProxyAddress"},
    {111, "FromCountry"},
    {112, "FromZipcode"},
    {113, "FromTown"},
    {114, "FromPabx"},
    {115, "FromPhone"},
    {116, "FromPrefix"},
    {121, "ToPrefix"},
    {122, "ToPhone"},
    {123, "ToPostfix"},
    {124, "ToName"},
    {125, "ToTechno"},
    {126, "ToType"},
    {131, "PPPScript"},
    {132, "Pulse"},
    {133, "Modem"},
    {134, "DelayPrefix"},
    {135, "DelayPostfix"},
    // Applications entry
    {201, "Connection"},
    {202, "BootIdf"},
    {203, "NavigatorIdf"},
};

const char* ItemName(int32_t item, int32_t first, int32_t last) {
  if (item < first || item > last) return nullptr;
  for (const ItemRow& row : kItems) {
    if (row.item == item) return row.name;
  }
  return nullptr;
}

// The value name of an item at the key that service and subKey select; null for a refused item.
const char* ItemNameAt(int32_t item, const char* service, const char* subKey) {
  if (service == nullptr) return ItemName(item, 1, 3);
  return subKey != nullptr ? ItemName(item, 101, 203) : ItemName(item, 11, 76);
}

int32_t ReadItem(const char* path, const char* name, char* buffer, int32_t size) {
  RegistryKey key;
  if (!key.Open(HKEY_LOCAL_MACHINE, path, KEY_READ)) return 0;
  DWORD type = 0;
  DWORD count = static_cast<DWORD>(size);
  if (RegQueryValueExA(key.get(), name, nullptr, &type, reinterpret_cast<BYTE*>(buffer), &count) !=
          ERROR_SUCCESS ||
      type != REG_SZ) {
    return 0;
  }
  if (count < static_cast<DWORD>(size)) buffer[count] = '\0';
  return 1;
}

int32_t WriteItem(const char* path, const char* name, const char* buffer, int32_t size) {
  RegistryKey key;
  return key.Open(HKEY_LOCAL_MACHINE, path, KEY_WRITE) &&
         key.SetText(name, buffer, static_cast<DWORD>(size));
}

int32_t DeleteItem(const char* path, const char* name) {
  RegistryKey key;
  if (!key.Open(HKEY_LOCAL_MACHINE, path, KEY_WRITE)) return 0;
  return RegDeleteValueA(key.get(), name) == ERROR_SUCCESS ? 1 : -1;
}

// Where an item lies, from its range: the arguments that ProductAccessItem needs besides the names.
struct ItemPlace {
  const char* service;
  int32_t kind;
  const char* subKey;
};

bool PlaceItem(int32_t item, const char* service, const char* subKey, ItemPlace* place) {
  if (item >= 1 && item <= 9) {
    *place = {nullptr, 0, nullptr};
  } else if (item >= 11 && item <= 99) {
    *place = {service, 0, nullptr};
  } else if (item >= 101 && item <= 199) {
    *place = {service, kKindNetProfile, subKey};
  } else if (item >= 201 && item <= 299) {
    *place = {service, kKindApplication, subKey};
  } else {
    return false;
  }
  return true;
}

struct LanguageRow {
  int32_t number;
  const char* written;
  const char* alsoRead[2];
};

constexpr LanguageRow kLanguages[] = {
    {ProductFrench, "FR", {"FRA", nullptr}},    {ProductEnglish, "GB", {"ENG", "US"}},
    {ProductGerman, "DE", {"GER", nullptr}},    {ProductSpanish, "ES", {nullptr, nullptr}},
    {ProductItalian, "IT", {nullptr, nullptr}},
};

int32_t ItemOfLanguage(const char* service) {
  return service != nullptr ? kItemServiceLanguage : kItemLanguage;
}

}  // namespace

int32_t ProductAccessItem(int32_t item, const char* service, int32_t kind, const char* subKey,
                          char* buffer, int32_t size, int32_t operation) {
  ProductPath path;
  const char* const name = ItemNameAt(item, service, subKey);
  if (name == nullptr || !BuildProductPath(service, kind, subKey, path)) return -1;
  if (operation != kOperationDelete && (buffer == nullptr || size < 0)) return -1;
  switch (operation) {
    case kOperationRead:
      return ReadItem(path, name, buffer, size);
    case kOperationWrite:
      return WriteItem(path, name, buffer, size);
    case kOperationDelete:
      return DeleteItem(path, name);
    default:
      return -1;
  }
}

char* ProductGetItem(int32_t item, const char* service, const char* subKey, char* buffer,
                     int32_t size) {
  constexpr int32_t kReadSize = 511;
  ItemPlace place;
  if (!PlaceItem(item, service, subKey, &place)) return nullptr;
  char value[kReadSize] = {};
  const bool isRead = ProductAccessItem(item, place.service, place.kind, place.subKey, value,
                                        kReadSize, kOperationRead) == 1;
  // A value of 511 bytes without a NUL is cut to the 510 characters that a text can have.
  value[kReadSize - 1] = '\0';
  if (buffer == nullptr) {
    if (!isRead) return nullptr;
    const size_t length = strlen(value);
    char* const text = new (std::nothrow) char[length + 1];
    return text != nullptr ? static_cast<char*>(memcpy(text, value, length + 1)) : nullptr;
  }
  if (size < 1) return nullptr;
  if (!isRead) {
    buffer[0] = '\0';
    return nullptr;
  }
  if (size <= kReadSize) value[size - 1] = '\0';  // what the caller has room for
  (void)CopyText(buffer, static_cast<size_t>(size), value);
  return buffer;
}

int32_t ProductSetItem(int32_t item, const char* service, const char* subKey, const char* text) {
  ItemPlace place;
  if (text == nullptr || !PlaceItem(item, service, subKey, &place)) return -1;
  // The write reads from the text alone; the one buffer of all operations just isn't const.
  return ProductAccessItem(item, place.service, place.kind, place.subKey, const_cast<char*>(text),
                           static_cast<int32_t>(strlen(text)), kOperationWrite);
}

int32_t ProductGetLanguage(const char* service) {
  char text[15] = {};
  if (ProductGetItem(ItemOfLanguage(service), service, nullptr, text, sizeof(text)) == nullptr) {
    return ProductUnknownLanguage;
  }
  for (const LanguageRow& row : kLanguages) {
    if (EqualIgnoringCase(text, row.written)) return row.number;
    for (const char* other : row.alsoRead) {
      if (other != nullptr && EqualIgnoringCase(text, other)) return row.number;
    }
  }
  return ProductUnknownLanguage;
}

int32_t ProductSetLanguage(const char* service, int32_t number) {
  const char* text = "";
  for (const LanguageRow& row : kLanguages) {
    if (row.number == number) text = row.written;
  }
  return ProductSetItem(ItemOfLanguage(service), service, nullptr, text);
}
