// The library of the product's registry tree.
#include "registration/product_registry.h"

#include <sstream>
#include <string>

#include "engine/browsers.h"
#include "registration/registered_product.h"
#include "tests/support/allocation_faults.h"
#include "tests/support/product_test.h"
#include "ui/side_commands.h"

namespace {

using namespace std::string_literals;

const std::string kRoot = "SOFTWARE\\Zeb\\Moriv";
const std::string kServices = kRoot + "\\Services";

class ProductRegistry : public ProductTest {
 protected:
  ProductRegistry() { EXPECT_EQ(ProductCreateTree(nullptr), 1); }

  static void MakeService(const std::string& name, const std::string& profile,
                          const std::string& application) {
    ASSERT_EQ(ProductCreateTree(name.c_str()), 1);
    MakeRegistryKey(kServices + "\\" + name + "\\NetProfiles\\" + profile);
    MakeRegistryKey(kServices + "\\" + name + "\\Applications\\" + application);
  }

  static std::string Names(KeyNameNode* list) {
    std::string names;
    for (auto* node = list; node != nullptr; node = node->next) names += node->name + " "s;
    ProductFreeList(list);
    return names;
  }

  // What ProductGetItem leaves in a buffer that held "old".
  static std::string Get(int32_t item, const char* service = nullptr, const char* subKey = nullptr,
                         int32_t size = 600) {
    char buffer[600] = "old";
    const char* const text = ProductGetItem(item, service, subKey, buffer, size);
    return text != nullptr ? text : "null, " + std::string(buffer);
  }
};

TEST_F(ProductRegistry, EveryItemHasItsNumberItsKeyAndItsName) {
  MakeService("Sky", "home", "home");
  const std::string sky = kServices + "\\Sky";
  // From the number of the first one in a row on.
  const std::pair<int32_t, const char*> rows[] = {
      {1, "InstallDir Language Version"},
      {11,
       "InstallDir CdromEdition CdromRelease CdromIniFile CdromPath ConfFile ExeConfFile "
       "CacheFile Version"},
      {21, "ShortName LongName MainViewerName SmallIcon LargeIcon Country Language"},
      {31,
       "InstallId ServiceActivated SaiId EnvId Connection BootIdf NavigatorIdf LastId "
       "LastIdKey LastIdDate"},
      {51, "CurrentProfile HelpProfile PopBookFile PhonebookName PhonebookFile Keys CompDll"},
      {71, "ContentSound InformationSound ApplicativeSound HelpSound EffectSound BackgroundSound"},
      {101,
       "NetworkType DomainName Stats ZebAddress DnsAddress PopAddress SmtpAddress NewsAddress "
       "ProxyAddress"},
      {111, "FromCountry FromZipcode FromTown FromPabx FromPhone FromPrefix"},
      {121, "ToPrefix ToPhone ToPostfix ToName ToTechno ToType"},
      {131, "PPPScript Pulse Modem DelayPrefix DelayPostfix"},
      {201, "Connection BootIdf NavigatorIdf"}};
  int32_t next = -1;
  const auto expectNoneBefore = [&](int32_t item) {
    for (; next < item; ++next) {
      const bool hasNoKey = next < 1 || next % 100 == 0 || next == 10 || next > 299;
      EXPECT_EQ(Get(next, "Sky", "home"), hasNoKey ? "null, old" : "null, ") << next;
      EXPECT_EQ(ProductSetItem(next, "Sky", "home", "text"), -1) << next;
    }
  };
  for (const auto& [first, words] : rows) {
    expectNoneBefore(first);
    const std::string key = first < 10    ? kRoot
                            : first < 100 ? sky
                            : first < 200 ? sky + "\\NetProfiles\\home"
                                          : sky + "\\Applications\\home";
    std::istringstream names(words);
    for (std::string name; names >> name; ++next) {
      const std::string text = std::to_string(next);
      EXPECT_EQ(ProductSetItem(next, "Sky", "home", text.c_str()), 1) << next;
      EXPECT_EQ(Get(next, "Sky", "home"), text);
      EXPECT_EQ(GetRegistryBytes(key, name.c_str()), text) << name << " without its NUL";
    }
  }
  expectNoneBefore(320);
  EXPECT_EQ(Get(101, "Sky"), "null, ") << "a profile's item without a profile";
  EXPECT_EQ(Get(11), "null, ") << "a service's item without a service";
  EXPECT_EQ(ProductSetItem(11, "NoSuch", nullptr, "text"), 0) << "a write makes no key";
  EXPECT_EQ(ProductSetItem(1, nullptr, nullptr, nullptr), -1);
}

TEST_F(ProductRegistry, EitherKindTakesAnyItemOfASubKey) {
  MakeService("Sky", "home", "mail");
  char text[] = "modem";
  const struct {
    int32_t item, kind, operation, result;
  } rows[] = {{101, kKindApplication, kOperationWrite, 1},
              {101, kKindApplication, kOperationRead, 1},
              {101, kKindNetProfile, kOperationRead, 0},
              {101, 3, kOperationRead, -1},
              {101, kKindApplication, 4, -1},
              {101, kKindApplication, kOperationDelete, 1},
              {101, kKindApplication, kOperationDelete, -1},  // it is gone
              {76, kKindApplication, kOperationRead, -1}};
  for (const auto& [item, kind, operation, result] : rows) {
    EXPECT_EQ(ProductAccessItem(item, "Sky", kind, "mail", text, 5, operation), result)
        << item << " " << kind << " " << operation;
  }
}

TEST_F(ProductRegistry, NamesHaveTheirLengths) {
  for (const std::string& bad : {std::string("ab"), std::string(64, 's'), std::string()}) {
    EXPECT_EQ((Results{ProductCreateTree(bad.c_str()), ProductDeleteTree(bad.c_str()),
                       ProductSetItem(11, bad.c_str(), nullptr, "x"),
                       ProductDeleteNetProfile(bad.c_str(), "x")}),
              Results(4, -1))
        << bad;
  }
  for (const std::string& good : {std::string("abc"), std::string(63, 's')}) {
    EXPECT_EQ((Results{ProductCreateTree(good.c_str()), ProductRootExists(good.c_str()),
                       ProductDeleteTree(good.c_str())}),
              Results(3, 1))
        << good;
  }
  // "SOFTWARE\Zeb\Moriv\Services\Sky\NetProfiles\" has 44 of the 127 characters of a key's path.
  const std::string fits(83, 'p');
  MakeService("Sky", fits, "mail");
  // A deletion takes a name of 63 characters at most.
  MakeService("Sky", std::string(63, 'p'), "mail");
  EXPECT_EQ((Results{ProductKeyExists("Sky", kKindNetProfile, fits.c_str()),
                     ProductDeleteNetProfile("Sky", std::string(63, 'p').c_str())}),
            Results(2, 1));
  EXPECT_EQ((Results{ProductKeyExists("Sky", kKindNetProfile, (fits + "p").c_str()),
                     ProductSetItem(101, "Sky", (fits + "p").c_str(), "x"),
                     ProductDeleteNetProfile("Sky", std::string(64, 'p').c_str()),
                     ProductDeleteApplication("Sky", ""), ProductDeleteApplication(nullptr, "x"),
                     ProductKeyExists("Sky", 3, "x"), ProductDeleteSubKey("Sky", 3, "x")}),
            Results(7, -1));
}

TEST_F(ProductRegistry, ValuesEndWhereTheRegistrySaysOrAt510Characters) {
  for (const size_t size : {510u, 511u, 512u}) {
    SetRegistryText(kRoot, "Version", std::string(size, 'v'));
    EXPECT_EQ(Get(3), size < 512 ? std::string(510, 'v') : "null, ");
  }
  SetRegistryText(kRoot, "Version", "4.1.7");
  EXPECT_EQ(Get(3, nullptr, nullptr, 4), "4.1");
  EXPECT_EQ(Get(3, nullptr, nullptr, 0), "null, old");
  char* const owned = ProductGetItem(3, nullptr, nullptr, nullptr, 0);
  EXPECT_STREQ(owned, "4.1.7");
  delete[] owned;
  FailAllocation(1);
  EXPECT_EQ(ProductGetItem(3, nullptr, nullptr, nullptr, 0), nullptr);
}

TEST_F(ProductRegistry, AServiceComesAndGoesWithItsEntries) {
  MakeService("Sky", "b", "bapp");
  MakeService("Sky", "a", "aapp");  // keys that are there are fine
  EXPECT_EQ(Names(ProductListServices()), "Sky ");
  EXPECT_EQ(Names(ProductListNetProfiles("Sky")), "b a ");
  EXPECT_EQ(Names(ProductListApplications("Sky")), "bapp aapp ");
  EXPECT_EQ(Names(ProductListNetProfiles(nullptr)) + Names(ProductListApplications(nullptr)) +
                Names(ProductEnumKeys("Sky", 3)),
            "");
  // The root stays as long as a service is left, and without Services a service has no place.
  EXPECT_EQ(
      (Results{ProductDeleteNetProfile("Sky", "b"), ProductDeleteNetProfile("Sky", "b"),
               ProductDeleteTree(nullptr), HasRegistryKey(kServices + "\\Sky\\NetProfiles\\a"),
               ProductDeleteTree("Sky"), HasRegistryKey(kServices + "\\Sky"),
               ProductDeleteTree("Sky"), ProductDeleteTree(nullptr), HasRegistryKey(kRoot),
               HasRegistryKey("SOFTWARE\\Zeb"),
               ProductDeleteTree(nullptr),  // what has gone already is no refusal
               ProductCreateTree("Sky"), ProductDeleteTree("Sky")}),
      (Results{1, 0, -1, 1, 1, 0, 1, 1, 0, 1, 1, 0, 0}));
}

TEST_F(ProductRegistry, LanguagesAreReadInEveryForm) {
  const std::pair<const char*, int32_t> rows[] = {
      {"fra", 0},    {"Fr", 0},  {"GB", 1},         {"eng", 1}, {"US", 1},
      {"DE", 2},     {"GER", 2}, {"ES", 3},         {"IT", 4},  {"SPA", 1000},
      {"ITA", 1000}, {"", 1000}, {"FRANCAIS", 1000}};
  for (const auto& [text, number] : rows) {
    SetRegistryText(kRoot, "Language", text);
    EXPECT_EQ(ProductGetLanguage(nullptr), number) << text;
  }
  EXPECT_EQ((Results{ProductSetLanguage(nullptr, 7), ProductCreateTree("Sky"),
                     ProductGetLanguage("Sky"), ProductSetLanguage("Sky", ProductSpanish)}),
            (Results{1, 1, 1000, 1}));
  EXPECT_EQ(Get(2) + Get(27, "Sky"), "ES");
}

TEST_F(ProductRegistry, IsReadWithoutTheRightToWrite) {
  MakeService("Sky", "home", "mail");
  SetRegistryText(kRoot, "Version", "4.1.7");
  SetRegistryText(AppPathsKey("Opera.exe"), "Path", "C:\\windows");
  char text[260];
  for (const std::string scheme : {"htmlfile", "http"}) {
    machine::CurrentSettings().hasReadOnlyRegistry = false;
    SetRegistryText("SOFTWARE\\Classes\\" + scheme + "\\shell\\open\\command", "", scheme);
    machine::CurrentSettings().hasReadOnlyRegistry = true;
    EXPECT_EQ(ReadBrowserCommand(text, 260), 1);
    EXPECT_EQ(text, scheme);
  }
  EXPECT_EQ((Results{ProductRootExists(nullptr), FindOperaPluginDir(text, 260),
                     ProductSetItem(3, nullptr, nullptr, "5")}),
            (Results{1, 1, 0}));
  EXPECT_EQ(Get(3) + Names(ProductListServices()), "4.1.7Sky ");
}

TEST_F(ProductRegistry, ServicesAreToldAsFarAsTheirNamesFitAndEachBlocksARemoval) {
  char names[520] = "as it was";
  EXPECT_EQ(CheckDependingServices(names, sizeof(names)), 1);
  MakeRegistryKey(kServices + "\\Sky");
  MakeRegistryKey(kServices + "\\A");
  EXPECT_EQ(CheckDependingServices(nullptr, 0) + CheckDependingServices(names, 5), 0);
  EXPECT_STREQ(names, "as it was");
  EXPECT_EQ(CheckDependingServices(names, 6), 0);
  EXPECT_STREQ(names, "Sky,A");
  for (char c = 'a'; c < 'k'; ++c) MakeRegistryKey(kServices + "\\" + std::string(63, c));
  EXPECT_EQ(CheckDependingServices(names, sizeof(names)), 0);
  EXPECT_EQ(std::string(names).size(), 6u + 8 * 63 + 7) << "ends with the last whole one";
}

TEST_F(ProductRegistry, WhatCanNotBeDeletedIsRefused) {
  for (const int call : {1, 2}) {
    FailCall("RegDeleteKeyA", call);
    EXPECT_EQ(ProductDeleteTree(nullptr), -1) << call;
  }
}

TEST_F(ProductRegistry, AProductIsRegisteredWithADirectoryHoweverShort) {
  for (const char* directory : {"", "a"}) {
    ASSERT_TRUE(CopyText(context.installDir, directory));
    EXPECT_EQ(RegisterProduct(&context), *directory != '\0' ? StatusOk : StatusNotRegistered);
    EXPECT_EQ(Get(1), *directory != '\0' ? "a" : "null, ");
  }
  EXPECT_EQ(RegisterProduct(nullptr), StatusNotRegistered);
  SetupRequest record = {};
  EXPECT_EQ(ReadRegisteredProduct(&record), 1);
  EXPECT_EQ(record.productFound, 1);
}

TEST_F(ProductRegistry, ANameThatFitsNoNodeBlocksARemovalToo) {
  MakeRegistryKey(kServices + "\\" + std::string(64, 's'));
  char names[520] = "old";
  EXPECT_EQ(ProductListServices(), nullptr);
  EXPECT_EQ(CheckDependingServices(names, sizeof(names)), 0);
  EXPECT_STREQ(names, "");
  machine::CurrentSettings().ntFamily = false;  // there a key goes with all below it
  EXPECT_EQ(ProductDeleteTree(nullptr), -1);
  EXPECT_TRUE(HasRegistryKey(kServices));
}

}  // namespace
