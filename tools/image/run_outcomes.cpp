#include "tools/image/run_outcomes.h"

#include <algorithm>
#include <charconv>

#include "core/event_list.h"

namespace image {
namespace {

constexpr char kNothing[] = "Nothing.";
constexpr char kReport[] = "This is a fault of the setup program: report it, with the log.";
constexpr char kGetAnew[] =
    "Get the setup program anew: this one is damaged or was made wrong. \"moriv-image verify\" "
    "says where.";
constexpr char kFreeMemory[] = "Close programs, and run it again.";

constexpr RunOutcome kOutcomes[] = {
    {StatusOk, "StatusOk", "Success: all is done.", kNothing},
    {0, "", "The help was shown. Nothing was installed or removed.",
     "Look for /h or /? on the command line if an install was meant."},
    {StatusBadArgument, "StatusBadArgument",
     "An argument that must be there was missing: in a dialog, the package for a removal.",
     "Run the removal again."},
    {StatusBufferTooSmall, "StatusBufferTooSmall", "A target path is longer than 259 characters.",
     "Choose a shorter installation directory."},
    {StatusDeleteFailed, "StatusDeleteFailed",
     "A file that stands in the way of a new one can't be deleted: it is in use or read-only.",
     "Close the program that uses the file which the log names, or take its read-only mark away, "
     "and run it again."},
    {StatusCreateFileFailed, "StatusCreateFileFailed", "A target file can't be made.",
     "See to it that the directory of the file which the log names can be written, that nothing "
     "else bears its name and that the disk isn't full; run it again."},
    {StatusWriteRemovalFailed, "StatusWriteRemovalFailed", "The removal program can't be written.",
     "See to it that the Windows directory can be written, and run it again."},
    {StatusInternal, "StatusInternal",
     "A record without a stream in a setup image, or a target path of fewer than 4 characters. "
     "A dialog also: the program's path can't be had, or an update has no package.",
     kGetAnew},
    {StatusCreateDirFailed, "StatusCreateDirFailed", "A directory of a target path can't be made.",
     "See to it that the drive can be written and that no file bears the name of a directory in "
     "the path which the log names; run it again."},
    {StatusBadDirectory, "StatusBadDirectory", "No valid installation directory.",
     "Give one with /d:, in full and without quotes."},
    {StatusNoSystemDir, "StatusNoSystemDir",
     "The system doesn't tell its Windows or system directory, and a file goes there.",
     "Mend the system; no other package would fare better."},
    {StatusBadRecord, "StatusBadRecord",
     "The package is damaged: the next record can't be read or is none.", kGetAnew},
    {StatusCancelled, "StatusCancelled",
     "The user stopped the run, or meant to when it was done. What was done until then stays.",
     "Look into the log for what was done, and run it again to finish."},
    {StatusDialogAborted, "StatusDialogAborted",
     "The dialog was left by the button of its failure page, or the system could not make it.",
     "Look into the log for the failure itself. If it has none of this run, run it again with /s."},
    {StatusBadPackage, "StatusBadPackage",
     "The program has no package behind it, or can't open its own file.",
     "Get the setup program anew, unless the log says that it can't be opened: then copy it to a "
     "local disk and run it there."},
    {StatusNoMemory, "StatusNoMemory", "No memory.", kFreeMemory},
    {StatusOpenFailed, "StatusOpenFailed", "The program's own file can't be opened.",
     "Copy the setup program to a local disk, and run it there."},
    {StatusReadFailed, "StatusReadFailed", "A stream can't be read whole, or can't be skipped.",
     kGetAnew},
    {StatusExpandFailed, "StatusExpandFailed",
     "A stream is bad, or the disk is full while a file is written.",
     "Free space on the disk of the file which the log names, and run it again. If there was "
     "enough, get the setup program anew."},
    {StatusSeekFailed, "StatusSeekFailed",
     "The first record lies where no position reaches, or the system refused to go there.",
     kGetAnew},
    {StatusServicesRemain, "StatusServicesRemain",
     "Services in the product's registry tree use it. Nothing was touched.",
     "Remove the services that the log names first, then run the removal again."},
    {StatusNoModulePath, "StatusNoModulePath", "The system doesn't tell the program its own path.",
     "Copy the setup program to a local disk, and run it there."},
    {StatusNoDiskSpace, "StatusNoDiskSpace",
     "The package needs more bytes than are free. Nothing was touched.",
     "Free space on the drive of the installation directory, or choose another one with /d:; run "
     "it again."},
    {StatusCopyFailed, "StatusCopyFailed", "A file can't be copied to its second or a later place.",
     "Free space on the drive of the file which the log names, see to it that its directory can "
     "be written, and run it again."},
    {StatusNoVersion, "StatusNoVersion", "A version text is empty.", kReport},
    {StatusRemovalProgramFailed, "StatusRemovalProgramFailed",
     "The files stand, the removal program was not written, nor the uninstall entry. Over an older "
     "install its entry still stands, and its removal program too if that could not be deleted.",
     "See to it that the Windows directory can be written, and run the install again."},
    {StatusNotRegistered, "StatusNotRegistered",
     "The files and the removal program are in place, but the registration failed.",
     "Run the install again with the rights of an administrator."},
    {StatusNoNetscape, "StatusNoNetscape",
     "Netscape is not on this machine; its copy of a file is skipped.", kNothing},
    {StatusNoExplorer, "StatusNoExplorer",
     "Internet Explorer is not on this machine; its copy of a file is skipped.", kNothing},
    {StatusNoOpera, "StatusNoOpera", "Opera is not on this machine; its copy of a file is skipped.",
     kNothing},
};

constexpr char kStart[] = "Start it elevated, from a local disk, by an account that may run it.";
constexpr RunOutcome kForeignOutcomes[] = {
    {5, "ERROR_ACCESS_DENIED",
     "Windows refused to start the program: its file may not be run there, or a policy forbids it. "
     "Nothing was touched.",
     kStart},
    {259, "STILL_ACTIVE",
     "The program was still running when its exit code was asked for: it is a Windows program, and "
     "shells don't wait for those by themselves.",
     "Wait for its end, as the recipes in docs/deployment.md do, and ask then."},
    {740, "ERROR_ELEVATION_REQUIRED",
     "Windows refused to start the program without an administrator's rights. Nothing was touched.",
     kStart},
    {1223, "ERROR_CANCELLED",
     "The question for an administrator's rights was answered with No. Nothing was touched.",
     "Run it again and say Yes, or start it elevated."},
    {1602, "ERROR_INSTALL_USEREXIT",
     "A fleet tool says that the user cancelled, or put the installation off. The setup program "
     "itself would give -1000010.",
     "Look into the fleet tool's own log, and offer the installation again."},
    {1618, "ERROR_INSTALL_ALREADY_RUNNING",
     "A fleet tool says that another installation is running. The setup program waits for none.",
     "Try again when the other installation is done."},
    {3010, "ERROR_SUCCESS_REBOOT_REQUIRED",
     "A fleet tool says that the machine is to be restarted. The setup program never asks for it.",
     "Look into the fleet tool's own log for what asked for it."},
};

struct FatalEvent {
  uint32_t event;
  std::span<const StatusCode> codes;
};

// A package that can't be opened is one code to a silent run, whatever kept it from opening.
constexpr StatusCode kAtOpening[] = {StatusBadPackage};
constexpr StatusCode kAtPositioning[] = {StatusBadPackage, StatusSeekFailed};
constexpr StatusCode kAtMemory[] = {StatusNoMemory};
constexpr StatusCode kAtRecord[] = {StatusBadRecord};
constexpr StatusCode kAtResolving[] = {StatusBufferTooSmall, StatusNoSystemDir, StatusNoMemory};
constexpr StatusCode kAtSkipping[] = {StatusReadFailed};
constexpr StatusCode kAtServices[] = {StatusServicesRemain};
constexpr StatusCode kAtDirectories[] = {StatusCreateDirFailed, StatusInternal};
constexpr StatusCode kAtExpanding[] = {StatusCreateFileFailed, StatusExpandFailed, StatusReadFailed,
                                       StatusNoMemory};
constexpr StatusCode kAtSpace[] = {StatusNoDiskSpace};
constexpr StatusCode kAtCopying[] = {StatusCopyFailed};
constexpr StatusCode kAtChoosing[] = {StatusBadDirectory};
constexpr StatusCode kAtDeleting[] = {StatusDeleteFailed};

constexpr FatalEvent kFatalEvents[] = {
    {EventNoMemory, kAtMemory},         {EventBadRecord, kAtRecord},
    {EventUnresolved, kAtResolving},    {EventOpenFailed, kAtOpening},
    {EventSeekFailed, kAtPositioning},  {EventReadFailed, kAtSkipping},
    {EventBadPackage, kAtOpening},      {EventNoImagePath, kAtOpening},
    {EventServicesRemain, kAtServices}, {EventNoDirectory, kAtDirectories},
    {EventExpandFailed, kAtExpanding},  {EventNoDiskSpace, kAtSpace},
    {EventCopyFailed, kAtCopying},      {EventBadDirectory, kAtChoosing},
    {EventDeleteFailed, kAtDeleting},
};

}  // namespace

std::span<const RunOutcome> RunOutcomes() {
  return kOutcomes;
}

const RunOutcome* FindRunOutcome(StatusCode code) {
  const RunOutcome* found = std::ranges::find(kOutcomes, code, &RunOutcome::code);
  return found != std::ranges::end(kOutcomes) ? found : nullptr;
}

const RunOutcome* FindForeignOutcome(StatusCode code) {
  const RunOutcome* found = std::ranges::find(kForeignOutcomes, code, &RunOutcome::code);
  return found != std::ranges::end(kForeignOutcomes) ? found : nullptr;
}

std::optional<StatusCode> ParseExitCode(std::string_view text) {
  const bool isHexadecimal = text.starts_with("0x") || text.starts_with("0X");
  if (isHexadecimal) text.remove_prefix(2);
  if (isHexadecimal && text.starts_with('-')) return std::nullopt;
  int64_t value = 0;
  const char* const end = text.data() + text.size();
  const auto [behind, error] = std::from_chars(text.data(), end, value, isHexadecimal ? 16 : 10);
  if (error != std::errc() || behind != end) return std::nullopt;
  if (value < INT32_MIN || value > int64_t{UINT32_MAX}) return std::nullopt;
  return static_cast<StatusCode>(static_cast<uint32_t>(value));
}

std::span<const StatusCode> CodesOfFatalEvent(uint32_t event) {
  const auto* found = std::ranges::find(kFatalEvents, event, &FatalEvent::event);
  return found != std::ranges::end(kFatalEvents) ? found->codes : std::span<const StatusCode>();
}

}  // namespace image
