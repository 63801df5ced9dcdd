// The library of the product's registry tree.
#include "registration/product_registry.h"

#include <string>
#include <vector>

#include "engine/browsers.h"
#include "registration/registered_product.h"
#include "tests/support/product_test.h"

namespace {

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

  static std::vector<std::string> Names(KeyNameNode* list) {
    std::vector<std::string> names;
    for (const KeyNameNode* node = list; node != nullptr; node = node->next) {
      names.emplace_back(node->name);
    }
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

using Strings = std::vector<std::string>;

TEST_F(ProductRegistry, EveryRangeOfItemsHasItsKey) {
  MakeService("Sky", "home", "mail");
  const struct {
    int32_t item;
    const char *service, *subKey;
  } rows[] = {
      {3, nullptr, nullptr}, {76, "Sky", nullptr}, {135, "Sky", "home"}, {203, "Sky", "mail"}};
  for (const auto& [item, service, subKey] : rows) {
    const std::string text = "item " + std::to_string(item);
    EXPECT_EQ(ProductSetItem(item, service, subKey, text.c_str()), 1);
    EXPECT_EQ(Get(item, service, subKey), text);
  }
  char text[32];
  DWORD size = sizeof(text);
  EXPECT_EQ(ReadRegistryValue(HKEY_LOCAL_MACHINE, kRoot.c_str(), "Version", text, &size), 1);
  EXPECT_EQ(size, 6u) << "a text is stored without its NUL";
}

TEST_F(ProductRegistry, RefusedItemsAndAbsentOnesAreToldApart) {
  MakeService("Sky", "home", "mail");
  for (const int32_t item : {-1, 0, 10, 100, 200, 300}) {
    EXPECT_EQ(Get(item, "Sky", "x"), "null, old") << item;
    EXPECT_EQ(ProductSetItem(item, "Sky", "x", "text"), -1) << item;
  }
  for (const int32_t item : {4, 20, 50, 77, 110, 136, 204}) {
    EXPECT_EQ(Get(item, "Sky", "x"), "null, ") << item;
    EXPECT_EQ(ProductSetItem(item, "Sky", "x", "text"), -1) << item;
  }
  EXPECT_EQ(Get(101, "Sky"), "null, ") << "a profile's item without a profile";
  EXPECT_EQ(Get(11), "null, ") << "a service's item without a service";
  EXPECT_EQ(ProductSetItem(11, "NoSuch", nullptr, "text"), 0) << "a write makes no key";
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
    EXPECT_EQ(ProductCreateTree(bad.c_str()), -1) << bad;
    EXPECT_EQ(ProductDeleteTree(bad.c_str()), -1) << bad;
    EXPECT_EQ(ProductSetItem(11, bad.c_str(), nullptr, "x"), -1) << bad;
    EXPECT_EQ(ProductDeleteNetProfile(bad.c_str(), "x"), -1) << bad;
  }
  for (const std::string& good : {std::string("abc"), std::string(63, 's')}) {
    EXPECT_EQ(ProductCreateTree(good.c_str()), 1) << good;
    EXPECT_EQ(ProductRootExists(good.c_str()), 1) << good;
    EXPECT_EQ(ProductDeleteTree(good.c_str()), 1) << good;
  }
  EXPECT_EQ(ProductDeleteApplication("Sky", ""), -1);
  // "SOFTWARE\Zeb\Moriv\Services\Sky\NetProfiles\" has 44 of the 127 characters of a key's path.
  const std::string fits(83, 'p');
  MakeService("Sky", fits, "mail");
  EXPECT_EQ(ProductKeyExists("Sky", kKindNetProfile, fits.c_str()), 1);
  EXPECT_EQ(ProductKeyExists("Sky", kKindNetProfile, (fits + "p").c_str()), -1);
  EXPECT_EQ(ProductSetItem(101, "Sky", (fits + "p").c_str(), "x"), -1);
}

TEST_F(ProductRegistry, ValuesEndWhereTheRegistrySaysOrAt510Characters) {
  SetRegistryText(kRoot, "Version", std::string(511, 'v'));
  EXPECT_EQ(Get(3), std::string(510, 'v'));
  SetRegistryText(kRoot, "Version", std::string(512, 'v'));
  EXPECT_EQ(Get(3), "null, ");
  SetRegistryText(kRoot, "Version", "4.1.7");
  EXPECT_EQ(Get(3, nullptr, nullptr, 4), "4.1");
  char* const owned = ProductGetItem(3, nullptr, nullptr, nullptr, 0);
  EXPECT_STREQ(owned, "4.1.7");
  delete[] owned;
}

TEST_F(ProductRegistry, AServiceComesAndGoesWithItsEntries) {
  MakeService("Sky", "b", "bapp");
  MakeService("Sky", "a", "aapp");  // keys that are there are fine
  EXPECT_EQ(Names(ProductListServices()), Strings{"Sky"});
  EXPECT_EQ(Names(ProductListNetProfiles("Sky")), (Strings{"b", "a"}));
  EXPECT_EQ(Names(ProductListApplications("Sky")), (Strings{"bapp", "aapp"}));
  EXPECT_EQ(ProductListNetProfiles(nullptr), nullptr);
  EXPECT_EQ(ProductEnumKeys("Sky", 3), nullptr) << "there is no third kind";
  EXPECT_EQ(ProductKeyExists("Sky", 3, "x"), -1);
  EXPECT_EQ(ProductDeleteSubKey("Sky", 3, "x"), -1);
  EXPECT_EQ(ProductDeleteNetProfile("Sky", "b"), 1);
  EXPECT_EQ(ProductDeleteNetProfile("Sky", "b"), 0);
  EXPECT_EQ(ProductDeleteTree(nullptr), -1) << "a service is left";
  EXPECT_TRUE(HasRegistryKey(kServices + "\\Sky\\NetProfiles\\a"));
  EXPECT_EQ(ProductDeleteTree("Sky"), 1);
  EXPECT_FALSE(HasRegistryKey(kServices + "\\Sky"));
  EXPECT_EQ(ProductDeleteTree(nullptr), 1);
  EXPECT_FALSE(HasRegistryKey(kRoot));
  EXPECT_TRUE(HasRegistryKey("SOFTWARE\\Zeb"));
  EXPECT_EQ(ProductCreateTree("Sky"), 0) << "no Services key to stand in";
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
  EXPECT_EQ(ProductSetLanguage(nullptr, 7), 1);
  EXPECT_EQ(Get(2), "");
  ASSERT_EQ(ProductCreateTree("Sky"), 1);
  EXPECT_EQ(ProductGetLanguage("Sky"), 1000);
  EXPECT_EQ(ProductSetLanguage("Sky", ProductSpanish), 1);
  EXPECT_EQ(Get(27, "Sky"), "ES");
}

TEST_F(ProductRegistry, JoinedNamesFitOrLeaveTheBufferAloneAndEndWithTheLastWholeOne) {
  char names[520] = "as it was";
  MakeRegistryKey(kServices + "\\Sky");
  MakeRegistryKey(kServices + "\\A");
  EXPECT_EQ(CheckDependingServices(nullptr, 0), 0);
  EXPECT_EQ(CheckDependingServices(names, 5), 0);
  EXPECT_STREQ(names, "as it was");
  EXPECT_EQ(CheckDependingServices(names, 6), 0);
  EXPECT_STREQ(names, "Sky,A");
  for (char c = 'a'; c < 'k'; ++c) MakeRegistryKey(kServices + "\\" + std::string(63, c));
  EXPECT_EQ(CheckDependingServices(names, sizeof(names)), 0);
  EXPECT_EQ(std::string(names).size(), 6u + 8 * 63 + 7);
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
