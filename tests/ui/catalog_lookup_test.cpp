// From a catalog id and a language to a text.
#include "tests/support/product_test.h"
#include "ui/catalog.h"

namespace {

class CatalogLookup : public ProductTest {
 protected:
  static std::string Load(const SetupContext* context, uint32_t id, size_t size = 500) {
    char buffer[500] = "old";
    LoadCatalogText(context, id, buffer, size);
    return buffer;
  }

  std::string LoadIn(int32_t language, uint32_t id) {
    context.currentLanguage = language;
    return Load(&context, id);
  }
};

TEST_F(CatalogLookup, ARowThatDoesNotExistIsEmpty) {
  EXPECT_EQ(LoadIn(kLanguageFrench, 0), "");
  EXPECT_EQ(LoadIn(kLanguageFrench, 112), "");
  EXPECT_EQ(LoadIn(50000, CatalogCancel), "");
  // Ids of the system have 16 bits: these would be 108 modulo 65536.
  EXPECT_EQ(LoadIn(65536, CatalogCancel), "");
  EXPECT_EQ(LoadIn(kLanguageEnglish, 65536 + CatalogCancel), "");
  EXPECT_EQ(LoadIn(-65536, 65536 + CatalogCancel), "Cancel") << "the sum is a row";
  EXPECT_EQ(LoadIn(-200, CatalogCancel), "");
  EXPECT_EQ(LoadIn(kLanguageEnglish, 0xFFFFFFFF), "");
}

TEST_F(CatalogLookup, ALongerTextIsCutAndNoBufferIsFine) {
  EXPECT_EQ(Load(nullptr, CatalogCancel, 7), "Cancel");
  EXPECT_EQ(Load(nullptr, CatalogCancel, 6), "Cance");
  EXPECT_EQ(Load(nullptr, CatalogCancel, 1), "");
  EXPECT_EQ(Load(nullptr, CatalogCancel, 0), "old");
  LoadCatalogText(nullptr, CatalogCancel, nullptr, 500);
}

TEST_F(CatalogLookup, TheSystemsPrimaryLanguageCounts) {
  const std::pair<LANGID, int32_t> rows[] = {
      {0x0C07, kLanguageGerman},  {0x0809, kLanguageEnglish}, {0x0C0A, kLanguageSpanish},
      {0x0410, kLanguageItalian}, {0x040C, kLanguageFrench},  {0x0413, kLanguageFrench},
      {0x0000, kLanguageFrench},  {0xFC07, kLanguageGerman},  {0x0207, kLanguageFrench}};
  for (const auto& [system, language] : rows) {
    machine::CurrentSettings().language = system;
    EXPECT_EQ(SystemLanguage(), language) << std::hex << system;
  }
}

}  // namespace
