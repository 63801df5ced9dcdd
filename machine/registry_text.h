// The text form of the registry: REGEDIT4, 8-bit.
//
//   REGEDIT4
//
//   [HKEY_LOCAL_MACHINE\SOFTWARE\Zeb\Moriv]     every key has a section, parents first
//   @="default value"
//   "InstallDir"="C:\\Moriv"                    REG_SZ whose only NUL is its last byte
//   "Language"=hex(1):46,52                     every other REG_SZ, or one with a control character
//   "Data"=hex(3):00,ff                         other types, by their number in hexadecimal
//
// Read besides: CR LF, hex: for hex(3):, dword:, hexadecimal lines continued by a backslash,
// comments behind a semicolon, keys under HKEY_CURRENT_USER, and HKEY_CLASSES_ROOT, whose keys are
// those of HKEY_LOCAL_MACHINE\SOFTWARE\Classes.
#pragma once

#include <memory>
#include <string>
#include <string_view>

#include "machine/registry_store.h"

namespace machine {

struct RegistryRoots {
  std::shared_ptr<RegistryKey> localMachine = std::make_shared<RegistryKey>();
  std::shared_ptr<RegistryKey> currentUser = std::make_shared<RegistryKey>();  // read and kept
};

// Adds the keys and values of the text to `roots`. False with "LINE: what" in `error`.
bool ReadRegistryText(std::string_view text, const RegistryRoots& roots, std::string* error);

std::string WriteRegistryText(const RegistryRoots& roots);

}  // namespace machine
