// Access to all that Moriv keeps in the registry, in one tree under HKEY_LOCAL_MACHINE:
//
//   SOFTWARE\Zeb\Moriv                                          items 1 to 3
//   SOFTWARE\Zeb\Moriv\Services                                 one subkey per service
//   ...\Services\(service)                                      items 11 to 76
//   ...\Services\(service)\NetProfiles\(profile)                items 101 to 135
//   ...\Services\(service)\Applications\(application)           items 201 to 203
//
// A value is addressed by its item number, which the library maps to a key and a value name. Values
// are REG_SZ, written without their NUL. The setup program uses the root alone, with a null
// service; the rest serves the programs that live in the tree.
//
// Limits in characters: service names 3 to 63, key paths 127, values that are read 510.
// Deletions alone want 1 to 63 characters of a profile or application name: elsewhere the path is
// its limit, and an empty name is the key that all of its kind lie in. Results: 1 for success; -1
// for what no registry can answer (a refused item, a bad name or kind, a path too long); 0
// for a key or value that is missing or refused.
// Each call opens and closes its keys; nothing is kept between calls.
#pragma once

#include <cstdint>

// Items that the setup program knows by name.
inline constexpr int32_t kItemInstallDir = 1;
inline constexpr int32_t kItemLanguage = 2;
inline constexpr int32_t kItemServiceLanguage = 27;

// Kinds of sub-key of a service.
inline constexpr int32_t kKindApplication = 1;
inline constexpr int32_t kKindNetProfile = 2;

// Operations of ProductAccessItem.
inline constexpr int32_t kOperationRead = 1;
inline constexpr int32_t kOperationWrite = 2;
inline constexpr int32_t kOperationDelete = 3;

// The library's language numbers.
enum ProductLanguage : int32_t {
  ProductFrench = 0,
  ProductEnglish = 1,
  ProductGerman = 2,
  ProductSpanish = 3,
  ProductItalian = 4,
  ProductUnknownLanguage = 1000,
};

// A list of subkey names. Made by the library, freed with ProductFreeList.
struct KeyNameNode {
  char name[64];
  KeyNameNode* next;
};

// Items

// The core of all item operations. Its key is the service's own, with a subKey one below it,
// without a service the root. Operation 1 reads into the buffer, of `size` bytes: 1 only for a
// REG_SZ value that fits; a text that fills it has no NUL. 2 writes `size` bytes from the buffer;
// the key must exist. Both give -1 for a null buffer or a negative size. 3 deletes the value; -1
// when the registry refuses.
int32_t ProductAccessItem(int32_t item, const char* service, int32_t kind, const char* subKey,
                          char* buffer, int32_t size, int32_t operation);

// The text of an item. With a buffer: copies at most size-1 characters, always ends them with a NUL
// and returns the buffer; without such a value empties it and returns null. With a null buffer:
// returns a new text, owned by the caller (delete[]), or null. A refused item gives null and leaves
// the buffer alone.
char* ProductGetItem(int32_t item, const char* service, const char* subKey, char* buffer,
                     int32_t size);

// Writes the text without its NUL. Makes no key. -1 also for a null text.
int32_t ProductSetItem(int32_t item, const char* service, const char* subKey, const char* text);

// Keys

// Whether the key can be read: 1 or 0. It is the service's, or with a subKey the one below it; for
// a null service the root.
int32_t ProductKeyExists(const char* service, int32_t kind, const char* subKey);
int32_t ProductRootExists(const char* service);

// Makes the root with its Services key, or a service with its two keys. The parent must exist; keys
// that are there already are fine.
int32_t ProductCreateTree(const char* service);

// Deletes the root, unless a service exists (-1), or one service with all below it. 0 when the
// parent doesn't open, -1 when a deletion is refused; a key that has gone already is no
// refusal. SOFTWARE\Zeb itself stays.
int32_t ProductDeleteTree(const char* service);

// Deletes one entry of NetProfiles or Applications. 0 when the registry refuses.
int32_t ProductDeleteSubKey(const char* service, int32_t kind, const char* name);
int32_t ProductDeleteNetProfile(const char* service, const char* name);
int32_t ProductDeleteApplication(const char* service, const char* name);

// Lists, in the registry's order; null for none. `isComplete`, which may be null, tells whether the
// walk ended for want of names: a name that doesn't fit a node ends it early, and then an empty
// list doesn't mean that there is no subkey.

// A null service lists the services.
KeyNameNode* ProductEnumKeys(const char* service, int32_t kind, bool* isComplete = nullptr);
KeyNameNode* ProductListServices(bool* isComplete = nullptr);
KeyNameNode* ProductListNetProfiles(const char* service);
KeyNameNode* ProductListApplications(const char* service);
void ProductFreeList(KeyNameNode* head);  // null is accepted

// Language of the root, or of a service

// ProductUnknownLanguage for a value that is missing or none of the known texts.
int32_t ProductGetLanguage(const char* service);
int32_t ProductSetLanguage(const char* service, int32_t number);
