#include "ui/wizard.h"

#include <malloc.h>

#include <cstdio>

#include "core/driver.h"
#include "machine/dialog_template.h"
#include "machine/executable_resources.h"
#include "machine/open_objects.h"
#include "machine/scripted_user.h"
#include "machine/windows.h"
#include "tests/support/product_test.h"
#include "tests/support/test_image.h"
#include "ui/language_list.h"
#include "ui/side_commands.h"

namespace {

// One line for a window: its id, class, style, place and text.
std::string Describe(const machine::TemplateItem& item) {
  char line[200];
  std::snprintf(line, sizeof(line), "%d %s %08X %d,%d %dx%d %s", item.id, item.className.c_str(),
                item.style | item.extendedStyle, item.x, item.y, item.width, item.height,
                item.text.c_str());
  return line;
}

TEST(DialogResource, IsTheTemplateToTheLetter) {
  const auto bytes = machine::OwnResource(5, 116);
  ASSERT_TRUE(bytes);
  const auto dialog = machine::ReadDialogTemplate(*bytes);
  ASSERT_TRUE(dialog);
  EXPECT_EQ(dialog->fontName, "MS Sans Serif");
  EXPECT_EQ(dialog->fontSize, 8);
  const char* const rows[] = {
      "0  90C808C0 0,0 315x174 Installation de la machine virtuelle Moriv",
      "65535 Static 50000006 0,0 41x174 ",
      "900 Static 5000010E 6,9 30x28 ",
      "911 Static 50020100 4,158 37x10 www.moriv.example",
      "910 Static 50021000 49,8 259x31 ZEB",
      "901 Static 50020000 49,58 259x46 Message d'installation ....",
      "65535 Static 50001007 49,48 259x1 ",
      "903 Edit 50810080 49,130 139x12 ",
      "904 Button 50010F00 189,130 16x12 ...",
      "918 Static 50020000 49,158 39x10 Langue :",
      "917 ComboBox 58230013 91,156 66x63 ",
      "908 Button 50010000 163,156 47x14 Supprimer",
      "907 Button 50010000 212,156 47x14 Suivant",
      "2 Button 50010000 261,156 47x14 Annuler",
      "65535 Static 50001007 49,148 259x1 ",
      "921 Static 50020202 216,130 92x11 0,0 Mo",
  };
  ASSERT_EQ(dialog->controls.size(), std::size(rows) - 1);
  EXPECT_EQ(Describe(dialog->frame), rows[0]);
  for (size_t i = 1; i < std::size(rows); ++i) {
    EXPECT_EQ(Describe(dialog->controls[i - 1]), rows[i]);
  }
  EXPECT_EQ(dialog->controls[1].pictureId, 118);
}

TEST(DialogResource, PicturesHaveTheirSizesAndPalettes) {
  for (const int id : {118, 120, 121, 122, 123, 124}) {
    const auto bytes = machine::OwnResource(2, id);
    ASSERT_TRUE(bytes) << id;
    ASSERT_GE(bytes->size(), 40u + 256 * 4) << id;
    const auto number = [&](size_t at) { return (*bytes)[at] | (*bytes)[at + 1] << 8; };
    EXPECT_EQ(number(4), id == 118 ? 45 : 26) << id;
    EXPECT_EQ(number(8), id == 118 ? 45 : 15) << id;
    EXPECT_EQ(number(14), 8) << id;
  }
}

class Wizard : public ProductTest {
 protected:
  Wizard() { ImageBuilder().Add("a.exe", "%INSTALL_DIR%", std::string(5000, 'a')).Write(&pc); }

  ~Wizard() override { machine::ForgetUser(); }

  StatusCode Run(const std::string& script, uint32_t options = kDefaultOptions) {
    pc.Write("user.txt", script);
    std::string error;
    EXPECT_TRUE(machine::LoadUser(pc.Host("user.txt"), &error)) << error;
    SetupRequest request = {};
    request.options = options;
    request.language = kLanguageFrench;
    const StatusCode code = RunSetup(request);
    machine::EndUser();
    return code;
  }
};

TEST_F(Wizard, AHundredRunsLeaveNothing) {
  const std::string install = "press 907\nescape\n";
  const std::string cancel = "answer yes\nescape\n";
  const std::string removal = "press 908\npress 1\n";
  size_t used = 0;
  for (int run = 0; run < 34; ++run) {
    EXPECT_EQ(Run(install), StatusOk);
    EXPECT_EQ(Run(cancel), StatusCancelled);
    EXPECT_EQ(Run(removal), StatusOk);
    EXPECT_EQ(machine::OpenObjects(), "") << run;
    EXPECT_EQ(machine::OpenDialog(), nullptr);
    EXPECT_EQ(wizardState.window, nullptr);
    // The first half fills what the process keeps for its life.
    if (run == 16) used = mallinfo2().uordblks;
  }
  // The machine's own records may grow by a little. The smallest block has 32 bytes: one that each
  // of the 17 rounds left would make 544.
  EXPECT_LT(mallinfo2().uordblks, used + 17 * 32);
}

TEST_F(Wizard, MissingPicturesAndFontsStopNothing) {
  // The graphics system gives no bitmap: then the flags are missing, and no more.
  FailAllCalls("LoadBitmapA");
  EXPECT_EQ(Run("press 907\npress 1\n"), StatusOk);
  FailAllCalls("CreateFontA");
  EXPECT_EQ(Run("press 909\npress 1\n"), StatusOk);
  EXPECT_EQ(machine::OpenObjects(), "");
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
