#include "core/driver.h"

#include "core/help.h"
#include "core/run_settings.h"
#include "engine/install_pass.h"
#include "engine/removal_pass.h"
#include "log/event_log.h"
#include "package/package_reader.h"
#include "registration/registered_product.h"
#include "registration/removal_program.h"
#include "registration/uninstall_entries.h"
#include "ui/wizard.h"

namespace {

// The log is written after all work; closing frees the events, so it comes last.
StatusCode FinishSilentRun(SetupContext* context, StatusCode code) {
  WriteLogs(&context->events, context->reportFile);
  (void)CloseSetup(context);
  return code;
}

StatusCode InstallSilently(SetupContext* context) {
  const TextField defaultDirectory(context->header.defaultDirectory);
  if (ChooseInstallDir(context, context->installDir, sizeof(context->installDir),
                       defaultDirectory.text) != StatusOk) {
    return GiveUp(&context->events, EventBadDirectory, context->installDir, StatusBadDirectory);
  }
  if (CheckDiskSpace(context) != StatusOk) {
    return GiveUp(&context->events, EventNoDiskSpace, context->installDir, StatusNoDiskSpace);
  }
  const StatusCode installed = InstallFiles(context);
  if (installed != StatusOk) return installed;

  // The files stand. What fails from here on is told by the code and stops nothing.
  StatusCode code = RegisterProduct(context);
  if (code == StatusOk) {
    Inform(&context->events, EventRegistered);
  } else {
    Warn(&context->events, EventNotRegistered);
  }
  char removalProgram[kPathSize] = {};
  if (WriteRemovalProgram(context, removalProgram, sizeof(removalProgram)) != StatusOk) {
    Warn(&context->events, EventRemovalProgramFailed, removalProgram);
    return StatusRemovalProgramFailed;
  }
  if ((context->options & OptionRegister) != 0) (void)WriteUninstallEntry(context);
  Inform(&context->events, EventRemovalProgramWritten, removalProgram);
  return code;
}

StatusCode RemoveSilently(SetupContext* context) {
  char services[kEventTextSize] = {};
  if (CheckDependingServices(services, sizeof(services)) == 0) {
    return GiveUp(&context->events, EventServicesRemain, services, StatusServicesRemain);
  }
  Inform(&context->events, EventRemoving);
  if (context->productFound == 1) {
    const StatusCode removed = RemoveProductFiles(context);
    if (removed != StatusOk) return removed;
  }
  Inform(&context->events, EventUnregistered);
  // Whatever the system refuses from here on is left to stand.
  (void)UnregisterProduct();
  if ((context->options & OptionRegister) != 0) (void)DeleteUninstallEntry();
  (void)ScheduleFinalCleanup();
  return StatusOk;
}

StatusCode RunSilently(SetupContext* context) {
  // Whatever kept the package from opening, the exit code is this one; the log tells the cause.
  if (OpenPackage(context) != StatusOk) return StatusBadPackage;
  (void)ApplyImageKind(context);  // a null context is all that these three could fail for
  (void)ChooseLanguage(context);
  (void)FindInstalledProduct(context);
  const bool isRemoval = (context->options & OptionRemove) != 0;
  return isRemoval ? RemoveSilently(context) : InstallSilently(context);
}

}  // namespace

StatusCode RunSetup(SetupRequest request) {
  SetupContext context = {};
  static_cast<SetupRequest&>(context) = request;
  context.productFound = 0;
  (void)ApplyDefaultOptions(&context.options);
  (void)ValidateLanguage(&context.language);
  context.currentLanguage = context.language;
  context.messageId = 0;
  context.result = StatusOk;

  if ((context.options & OptionHelp) != 0) {
    ShowHelp(&context);
    return 0;
  }
  // The dialog opens, closes and logs in steps of its own.
  if ((context.options & OptionSilent) == 0) return RunWizard(&context);
  return FinishSilentRun(&context, RunSilently(&context));
}
