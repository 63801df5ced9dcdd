// A hostile registry: its text is read and written again, the program's library asks it for all
// that it knows, and an image is installed and removed on it.
//
// The input is the text behind the heading, REGEDIT4.
#include <cstring>

#include "engine/browsers.h"
#include "machine/registry_text.h"
#include "registration/product_registry.h"
#include "registration/registered_product.h"
#include "tests/fuzz/silent_run.h"
#include "tests/support/test_image.h"

namespace {

void AskForPluginDirectories() {
  for (const auto find : {FindNetscapePluginDir, FindExplorerPluginDir, FindOperaPluginDir}) {
    for (const int32_t size : {1, 20, 260}) {
      std::string directory(static_cast<size_t>(size), 'x');
      const int found = find(directory.data(), size);
      EXPECT_NE(directory.find(found == 1 ? '\0' : 'x'), std::string::npos);
    }
  }
}

void AskForItems(const char* service) {
  for (const int32_t item : {1, 2, 3, 11, 27, 76, 101, 135, 201, 203}) {
    char small[4] = {};
    (void)ProductGetItem(item, service, "name", small, sizeof(small));
    EXPECT_NE(std::memchr(small, 0, sizeof(small)), nullptr);
    delete[] ProductGetItem(item, service, "name", nullptr, 0);
  }
  (void)ProductGetLanguage(service);
}

void AskForServices() {
  SetupRequest request = {};
  (void)ReadRegisteredProduct(&request);
  EXPECT_NE(std::memchr(request.installDir, 0, sizeof(request.installDir)), nullptr);
  char names[520] = {};
  KeyNameNode* const services = ProductListServices();
  EXPECT_TRUE(CheckDependingServices(names, sizeof(names)) == 0 || services == nullptr);
  AskForItems(nullptr);
  for (const KeyNameNode* node = services; node != nullptr; node = node->next) {
    AskForItems(node->name);
    ProductFreeList(ProductListNetProfiles(node->name));
    ProductFreeList(ProductListApplications(node->name));
  }
  // The first is taken away, so that a removal may get past the services.
  if (services != nullptr && services->next == nullptr) (void)ProductDeleteTree(services->name);
  ProductFreeList(services);
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  const std::string text = "REGEDIT4\n" + std::string(data, data + size);
  const machine::RegistryRoots roots;
  std::string error;
  if (!machine::ReadRegistryText(text, roots, &error)) {
    EXPECT_NE(error, "");
    return 0;
  }
  const std::string written = machine::WriteRegistryText(roots);
  const machine::RegistryRoots again;
  EXPECT_TRUE(machine::ReadRegistryText(written, again, &error)) << error;
  EXPECT_EQ(machine::WriteRegistryText(again), written);

  static const std::string image =
      ImageBuilder()
          .Add("a.dll", "%INSTALL_DIR%\\bin;%PLUGIN_ALL_DIR%\\sub;%PLUGIN_NS_DIR%", "some bytes")
          .Add("b.txt", "%PLUGIN_IE_DIR%;%SYS_DIR%", "other bytes")
          .Bytes();
  TestMachine pc("[disk C]\nwritable = 200000\n");
  pc.Write("registry.reg", text);
  pc.Write("drive_c/opera/opera.exe", "");
  pc.Write(kImage, image);
  pc.Restart();
  AskForPluginDirectories();
  AskForServices();
  EXPECT_EQ(machine::OpenObjects(), "");

  (void)RunSilently(pc, kImage, "/s /r");
  (void)RunSilently(pc, kImage, "/s /u /r");
  return 0;
}
