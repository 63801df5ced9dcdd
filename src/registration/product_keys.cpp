// Keys of the product's registry tree: paths, making, deleting, listing.
#include "registration/product_keys.h"

#include <cstring>
#include <new>

#include "platform/registry_key.h"
#include "platform/text.h"
#include "registration/product_registry.h"

namespace {

constexpr char kSoftwareKey[] = "SOFTWARE";
constexpr char kMakerKey[] = "SOFTWARE\\Zeb";
constexpr char kRootKey[] = "SOFTWARE\\Zeb\\Moriv";
constexpr char kServicesKey[] = "SOFTWARE\\Zeb\\Moriv\\Services";

constexpr char kServicesName[] = "Services";
constexpr char kProductName[] = "Moriv";
constexpr char kApplicationsName[] = "Applications";
constexpr char kNetProfilesName[] = "NetProfiles";

bool IsServiceName(const char* service) {
  if (service == nullptr) return false;
  const size_t length = strlen(service);
  return length >= 3 && length <= 63;
}

bool IsSubKeyKind(int32_t kind) {
  return kind == kKindApplication || kind == kKindNetProfile;
}

// The name of a kind's key under a service. The kind must be one.
const char* SubKeyFolder(int32_t kind) {
  return kind == kKindApplication ? kApplicationsName : kNetProfilesName;
}

// The key that holds the entries of a kind, or the services for a null service.
bool BuildFolderPath(const char* service, int32_t kind, ProductPath& path) {
  if (service == nullptr) return CopyText(path, kServicesKey);
  return IsSubKeyKind(kind) && BuildProductPath(service, 0, nullptr, path) &&
         AppendText(path, "\\") && AppendText(path, SubKeyFolder(kind));
}

int32_t CreateRoot() {
  RegistryKey software;
  RegistryKey root;
  RegistryKey services;
  return software.Open(HKEY_LOCAL_MACHINE, kSoftwareKey, KEY_WRITE) &&
         root.Create(software.get(), "Zeb\\Moriv") && services.Create(root.get(), kServicesName);
}

int32_t CreateService(const char* name) {
  if (!IsServiceName(name)) return -1;
  RegistryKey services;
  RegistryKey service;
  RegistryKey netProfiles;
  RegistryKey applications;
  return services.Open(HKEY_LOCAL_MACHINE, kServicesKey, KEY_WRITE) &&
         service.Create(services.get(), name) &&
         netProfiles.Create(service.get(), kNetProfilesName) &&
         applications.Create(service.get(), kApplicationsName);
}

// Deletes a key below an open one. One that an earlier deletion took is no refusal.
bool DeleteIfThere(const RegistryKey& key, const char* name) {
  const LSTATUS status = RegDeleteKeyA(key.get(), name);
  return status == ERROR_SUCCESS || status == ERROR_FILE_NOT_FOUND;
}

bool DeleteBelow(const RegistryKey& key, const char* folder, const char* name) {
  ProductPath path;
  return FormatText(path, sizeof(path), "%s\\%s", folder, name) && DeleteIfThere(key, path);
}

int32_t DeleteRoot() {
  bool isComplete = true;
  KeyNameNode* const services = ProductListServices(&isComplete);
  ProductFreeList(services);
  if (services != nullptr || !isComplete) return -1;
  RegistryKey key;
  if (!key.Open(HKEY_LOCAL_MACHINE, kMakerKey, KEY_WRITE)) return 0;
  if (!DeleteBelow(key, kProductName, kServicesName)) return -1;
  return DeleteIfThere(key, kProductName) ? 1 : -1;
}

// The results of deleting single entries aren't read: what stays makes the key's own deletion fail.
void DeleteEntries(const char* service, int32_t kind) {
  KeyNameNode* const names = ProductEnumKeys(service, kind);
  for (const KeyNameNode* node = names; node != nullptr; node = node->next) {
    (void)ProductDeleteSubKey(service, kind, node->name);
  }
  ProductFreeList(names);
}

int32_t DeleteService(const char* service) {
  if (!IsServiceName(service)) return -1;
  DeleteEntries(service, kKindNetProfile);
  DeleteEntries(service, kKindApplication);
  RegistryKey key;
  if (!key.Open(HKEY_LOCAL_MACHINE, kServicesKey, KEY_WRITE)) return 0;
  if (!DeleteBelow(key, service, kNetProfilesName) ||
      !DeleteBelow(key, service, kApplicationsName)) {
    return -1;
  }
  return DeleteIfThere(key, service) ? 1 : -1;
}

}  // namespace

bool BuildProductPath(const char* service, int32_t kind, const char* subKey, ProductPath& path) {
  if (service == nullptr) return CopyText(path, kRootKey);
  if (!IsServiceName(service)) return false;
  if (subKey == nullptr) return FormatText(path, sizeof(path), "%s\\%s", kServicesKey, service);
  return IsSubKeyKind(kind) && FormatText(path, sizeof(path), "%s\\%s\\%s\\%s", kServicesKey,
                                          service, SubKeyFolder(kind), subKey);
}

int32_t ProductKeyExists(const char* service, int32_t kind, const char* subKey) {
  ProductPath path;
  if (!BuildProductPath(service, kind, subKey, path)) return -1;
  RegistryKey key;
  return key.Open(HKEY_LOCAL_MACHINE, path, KEY_READ);
}

int32_t ProductRootExists(const char* service) {
  return ProductKeyExists(service, 0, nullptr);
}

int32_t ProductCreateTree(const char* service) {
  return service != nullptr ? CreateService(service) : CreateRoot();
}

int32_t ProductDeleteTree(const char* service) {
  return service != nullptr ? DeleteService(service) : DeleteRoot();
}

int32_t ProductDeleteSubKey(const char* service, int32_t kind, const char* name) {
  ProductPath path;
  if (service == nullptr || IsMissingOrEmpty(name) || strlen(name) > 63 ||
      !BuildFolderPath(service, kind, path)) {
    return -1;
  }
  RegistryKey key;
  return key.Open(HKEY_LOCAL_MACHINE, path, KEY_WRITE) &&
         RegDeleteKeyA(key.get(), name) == ERROR_SUCCESS;
}

int32_t ProductDeleteNetProfile(const char* service, const char* name) {
  return ProductDeleteSubKey(service, kKindNetProfile, name);
}

int32_t ProductDeleteApplication(const char* service, const char* name) {
  return ProductDeleteSubKey(service, kKindApplication, name);
}

KeyNameNode* ProductEnumKeys(const char* service, int32_t kind, bool* isComplete) {
  KeyNameNode* head = nullptr;
  KeyNameNode** tail = &head;
  ProductPath path;
  RegistryKey key;
  if (isComplete != nullptr) *isComplete = true;
  if (!BuildFolderPath(service, kind, path) || !key.Open(HKEY_LOCAL_MACHINE, path, KEY_READ)) {
    return nullptr;
  }
  for (DWORD index = 0;; ++index) {
    char name[sizeof(KeyNameNode::name)] = {};
    const LSTATUS status = RegEnumKeyA(key.get(), index, name, sizeof(name));
    if (status == ERROR_NO_MORE_ITEMS) return head;
    KeyNameNode* const node =
        status == ERROR_SUCCESS ? new (std::nothrow) KeyNameNode{{}, nullptr} : nullptr;
    if (node == nullptr) {
      if (isComplete != nullptr) *isComplete = false;
      return head;
    }
    (void)CopyText(node->name, name);  // the same size
    *tail = node;
    tail = &node->next;
  }
}

KeyNameNode* ProductListServices(bool* isComplete) {
  return ProductEnumKeys(nullptr, 0, isComplete);
}

KeyNameNode* ProductListNetProfiles(const char* service) {
  return service != nullptr ? ProductEnumKeys(service, kKindNetProfile) : nullptr;
}

KeyNameNode* ProductListApplications(const char* service) {
  return service != nullptr ? ProductEnumKeys(service, kKindApplication) : nullptr;
}

void ProductFreeList(KeyNameNode* head) {
  while (head != nullptr) {
    KeyNameNode* const next = head->next;
    delete head;
    head = next;
  }
}
