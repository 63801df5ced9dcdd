// The stand-in machine: a folder that plays a Windows PC for the native build.
//
//   machine.ini      settings, all optional
//   registry.reg     the registry as REGEDIT4 text, 8-bit
//   drive_c/ ...     a drive exists when its folder does
//
// A process has one machine at a time. The functions of platform/win32.h act on it; the ones here
// start and stop it, for the native entry, the machine tool and the tests.
#pragma once

#include <filesystem>
#include <string>

#include "machine/settings.h"

namespace machine {

// Opens the machine in `folder`; a missing or empty folder is made fresh first.
//   image  host path of the program that runs, for GetModuleFileNameA: X:\... when it lies in a
//          drive's folder, else the one file of the read-only drive Z:. May be empty: no program.
// Returns false, with one line that says what and where in `error`, when the folder can't be used
// or holds a bad machine.ini or registry.reg; then no machine runs.
bool Start(const std::filesystem::path& folder, const std::filesystem::path& image,
           std::string* error);

// The same without a program, its faults, and anything made: a part that is missing stays away. For
// the machine tool.
bool StartAsItIs(const std::filesystem::path& folder, std::string* error);

// Ends the machine. Returns what the program left open, as "2 files, 1 key", or "" for nothing.
std::string Stop();

// Of the machine that runs. Tests may change the settings between two calls of the program.
Settings& CurrentSettings();
const std::filesystem::path& Folder();

// Makes what a fresh machine has: C:\windows, C:\windows\system32, C:\Program Files and the
// registry's system keys. Leaves alone what is there.
bool MakeFresh(const std::filesystem::path& folder, std::string* error);

// Does what the system does at its next start: runs the RunOnce values of the machine that runs and
// takes them away. Understands the INF installer's command alone, and of the INF file DelFiles with
// DestinationDirs 10. Returns the lines that say what was done, one action a line.
std::string Restart();

}  // namespace machine
