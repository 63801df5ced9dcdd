// From a catalog id and a language to a text.
#include "tests/support/product_test.h"
#include "ui/catalog.h"

namespace {

class CatalogLookup : public ProductTest {
 protected:
  std::string LoadIn(int32_t language, uint32_t id, size_t size = 500) {
    char buffer[500] = "old";
    context.currentLanguage = language;
    LoadCatalogText(&context, id, buffer, size);
    return buffer;
  }
};

TEST_F(CatalogLookup, ARowThatDoesNotExistIsEmpty) {
  // Ids of the system have 16 bits: 65644 would be 108, a row, modulo 65536.
  for (const auto& [language, id] : {std::pair{kLanguageFrench, 0u},
                                     {kLanguageFrench, 112u},
                                     {50000, 108u},
                                     {65536, 108u},
                                     {kLanguageEnglish, 65644u},
                                     {-200, 108u},
                                     {kLanguageEnglish, 0xFFFFFFFF}}) {
    EXPECT_EQ(LoadIn(language, id), "") << language << " + " << id;
  }
  EXPECT_EQ(LoadIn(-65536, 65644), "Cancel") << "the sum is a row";
}

TEST_F(CatalogLookup, ALongerTextIsCutAndNoBufferIsFine) {
  for (const size_t size : {7u, 6u, 1u}) {
    EXPECT_EQ(LoadIn(kLanguageEnglish, CatalogCancel, size),
              std::string("Cancel").substr(0, size - 1));
  }
  EXPECT_EQ(LoadIn(kLanguageEnglish, CatalogCancel, 0), "old");
  LoadCatalogText(nullptr, CatalogCancel, nullptr, 500);
}

TEST_F(CatalogLookup, TheSystemsPrimaryLanguageHasTenBits) {
  for (const auto& [system, language] :
       {std::pair{0xFC07, kLanguageGerman}, {0x0207, kLanguageFrench}}) {
    machine::CurrentSettings().language = static_cast<LANGID>(system);
    EXPECT_EQ(SystemLanguage(), language) << system;
  }
}

}  // namespace
