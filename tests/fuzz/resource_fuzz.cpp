// Hostile resources of the stand-in: a .res file as such, and as the one that the program carries;
// the rest of the input after its first two bytes is also a dialog by itself.
#include <cstring>
#include <vector>

#include "machine/dialog_template.h"
#include "machine/own_resource.h"
#include "machine/resource_file.h"
#include "platform/win32.h"
#include "tests/fuzz/fuzz_target.h"

// The section that a program's resources are embedded in, here one to be written to.
asm(R"(
    .data
    .globl moriv_resources_begin
moriv_resources_begin:
    .space 8192
    .globl moriv_resources_end
moriv_resources_end:
    .text
)");

extern "C" uint8_t moriv_resources_begin[];
extern "C" uint8_t moriv_resources_end[];

namespace {

void AskForOwnResources(std::string_view bytes) {
  const auto room = static_cast<size_t>(moriv_resources_end - moriv_resources_begin);
  std::memset(moriv_resources_begin, 0, room);
  bytes.copy(reinterpret_cast<char*>(moriv_resources_begin), room);
  for (const UINT id : {0u, 15u, 100u, 118u, 10104u, 65535u}) {
    char text[32];
    const int length = LoadStringA(nullptr, id, text, sizeof(text));
    EXPECT_TRUE(length >= 0 && length < int{sizeof(text)} && text[length] == '\0');
  }
  const HBITMAP bitmap = LoadBitmapA(nullptr, MAKEINTRESOURCEA(118));
  EXPECT_TRUE(bitmap == nullptr || DeleteObject(bitmap) != FALSE);
  const auto dialog = machine::OwnResource(5, 116);  // RT_DIALOG
  if (dialog) (void)machine::ReadDialogTemplate(*dialog);
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  std::string_view input = TextOf(data, size);
  const int type = TakeByte(&input);
  const int id = TakeByte(&input);
  // A block of its own, so that a read behind its end is seen.
  const std::vector<uint8_t> file(input.begin(), input.end());
  const auto found = machine::FindInResourceFile(file, type, id);
  if (found && !found->empty()) {
    EXPECT_TRUE(found->data() >= file.data());
    EXPECT_TRUE(found->data() + found->size() <= file.data() + file.size());
  }
  const auto dialog = machine::ReadDialogTemplate(file);
  EXPECT_TRUE(!dialog || dialog->controls.size() * 18 <= file.size());
  AskForOwnResources(input);
  return 0;
}
