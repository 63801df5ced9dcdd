// The dialog: its resources, the way from a catalog id to a text, and runs that no package reaches.
#include "ui/wizard.h"

#include <cstdio>

#include "machine/dialog_template.h"
#include "machine/own_resource.h"
#include "machine/scripted_user.h"
#include "tests/support/product_test.h"
#include "ui/catalog.h"
#include "ui/control_ids.h"
#include "ui/dialog_look.h"
#include "ui/side_commands.h"

namespace {

// One line for a window: its id, class, style, place and text.
std::string Describe(const machine::TemplateItem& item) {
  char line[200];
  std::snprintf(line, sizeof(line), "%d %s %08X %d,%d %dx%d (%s)\n", item.id,
                item.className.c_str(), item.style | item.extendedStyle, item.x, item.y, item.width,
                item.height, item.text.c_str());
  return line;
}

TEST(DialogResource, HasItsControlsInTheirPlaces) {
  const auto bytes = machine::OwnResource(5, 116);
  ASSERT_TRUE(bytes);
  const auto dialog = machine::ReadDialogTemplate(*bytes);
  ASSERT_TRUE(dialog);
  EXPECT_EQ(dialog->fontName + std::to_string(dialog->fontSize), "MS Sans Serif8");
  std::string rows = Describe(dialog->frame);
  for (const machine::TemplateItem& control : dialog->controls) rows += Describe(control);
  EXPECT_EQ(rows, R"rows(0  90C808C0 0,0 315x174 (Installation de la machine virtuelle Moriv)
65535 Static 50000006 0,0 41x174 ()
900 Static 5000010E 6,9 30x28 ()
911 Static 50020100 4,158 37x10 (zeb.test)
910 Static 50021000 49,8 259x31 (ZEB)
901 Static 50020000 49,58 259x46 (Message d'installation ....)
65535 Static 50001007 49,48 259x1 ()
903 Edit 50810080 49,130 139x12 ()
904 Button 50010F00 189,130 16x12 (...)
918 Static 50020000 49,158 39x10 (Langue :)
917 ComboBox 58230013 91,156 66x63 ()
908 Button 50010000 163,156 47x14 (Supprimer)
907 Button 50010000 212,156 47x14 (Suivant)
2 Button 50010000 261,156 47x14 (Annuler)
65535 Static 50001007 49,148 259x1 ()
921 Static 50020202 216,130 92x11 (0,0 Mo)
)rows");
  EXPECT_EQ(dialog->controls[1].pictureId, 118);
}

TEST(DialogResource, PicturesStandUnderTheirIdsAndTheProgramIsNoDebugBuild) {
  const std::pair<int, const char*> rows[] = {{118, "logo"},        {120, "flag_united_kingdom"},
                                              {121, "flag_france"}, {122, "flag_germany"},
                                              {123, "flag_italy"},  {124, "flag_spain"}};
  for (const auto& [id, name] : rows) {
    const auto bytes = machine::OwnResource(2, id);
    ASSERT_TRUE(bytes) << id;
    std::ostringstream file;
    file << std::ifstream(std::string(MORIV_SOURCE_DIR "/src/resources/") + name + ".bmp").rdbuf();
    EXPECT_EQ(std::string(bytes->begin(), bytes->end()), file.str().substr(14)) << name;
  }
  const auto version = machine::OwnResource(16, 1);
  constexpr size_t kFlags = 40 + 28;  // behind the head of the block
  ASSERT_TRUE(version && version->size() > kFlags);
  EXPECT_EQ((*version)[kFlags], 0);
}

using CatalogLookup = ProductTest;

TEST_F(CatalogLookup, TextsAreCutToTheBufferAndRowsThatDoNotExistAreEmpty) {
  // Ids of the system have 16 bits: 65644 would be 108, a row, modulo 65536.
  const struct {
    int32_t language;
    uint32_t id;
    size_t size;
    const char* text;
  } rows[] = {{kLanguageFrench, 0, 500, ""},
              {kLanguageFrench, 112, 500, ""},
              {50000, 108, 500, ""},
              {65536, 108, 500, ""},
              {0, 65644, 500, ""},
              {-200, 108, 500, ""},
              {0, 0xFFFFFFFF, 500, ""},
              {-65536, 65644, 500, "Cancel"},
              {0, CatalogCancel, 7, "Cancel"},
              {0, CatalogCancel, 6, "Cance"},
              {0, CatalogCancel, 1, ""},
              {0, CatalogCancel, 0, "old"}};
  for (const auto& [language, id, size, text] : rows) {
    char buffer[500] = "old";
    context.currentLanguage = language;
    LoadCatalogText(&context, id, buffer, size);
    EXPECT_STREQ(buffer, text) << language << " + " << id << ", " << size;
  }
  LoadCatalogText(nullptr, CatalogCancel, nullptr, 500);
  for (context.header.spaceNeeded = 0; context.header.spaceNeeded < 2;
       ++context.header.spaceNeeded) {
    EXPECT_EQ(ShowSpaceLine(nullptr, &context), StatusOk);
  }
  EXPECT_EQ(ShowSpaceLine(nullptr, nullptr), StatusInternal);
  // The system's primary language has 10 bits.
  machine::CurrentSettings().language = 0xFC07;
  EXPECT_EQ(SystemLanguage(), kLanguageGerman);
  machine::CurrentSettings().language = 0x0207;
  EXPECT_EQ(SystemLanguage(), kLanguageFrench);
}

using Wizard = ProductTest;

TEST_F(Wizard, WithoutAContextItHasAFailurePageAndWithoutMemoryNoLanguages) {
  machine::SetUser([] {
    EXPECT_EQ(SendMessageA(GetDlgItem(wizardState.window, IDC_LANGUAGE), CB_GETCOUNT, 0, 0), 0);
    PostMessageA(wizardState.window, WM_COMMAND, IDC_FAILURE_END, 0);
  });
  FailAllocation(2);
  EXPECT_EQ(RunWizard(nullptr), StatusDialogAborted);
  EXPECT_EQ(wizardState.window, nullptr) << "the hooks would go on with a dialog that is gone";
  machine::ForgetUser();
  FailCall("DialogBoxParamA");
  EXPECT_EQ(RunWizard(&context), StatusDialogAborted);
}

TEST(SideCommands, CharactersAreReplacedOrDropped) {
  char text[] = "a\"b\"\"c";
  EXPECT_EQ(RemoveCharacter(text, '"', '\0'), 1);
  EXPECT_STREQ(text, "abc");
  EXPECT_EQ(RemoveCharacter(text, 'b', '-'), 1);
  EXPECT_STREQ(text, "a-c");
  EXPECT_EQ(RemoveCharacter(nullptr, 'b', '-'), -1);
}

}  // namespace
