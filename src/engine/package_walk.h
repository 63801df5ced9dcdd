// The one walk over the package: seek to the first record; then, for each, poll for a stop, read
// the record, resolve it to its targets, let the pass do its work, and go on behind the stream.
//
// A pass is a type with
//   static constexpr bool kAddsEvents      the walk adds events: the fatal one of its failure, and
//                                          those on browsers
//   static constexpr bool kTakesStreams    Work consumes the stream of a record that has targets
//   StatusCode Begin()                     once, before the first record and also when there is
//                                          none; not 1 ends the walk
//   FileRecord* RecordAt(int index)        where the record goes, cleared
//   StatusCode Work(const FileRecord&, const TargetList&)
//                                          1 to go on; anything else ends the walk with that result
#pragma once

#include "core/hooks.h"
#include "engine/resolver.h"
#include "package/package_reader.h"

namespace package_walk {

// Positions come from the package and are summed in 64 bits; one that has no signed 32-bit form is
// a seek that fails.
inline bool SeekTo(DataFile* file, int64_t position) {
  return position <= INT32_MAX && file->SeekTo(static_cast<int32_t>(position)) == 1;
}

inline bool SkipStream(DataFile* file, const FileRecord& record) {
  const int32_t position = file->Tell();
  return position != -1 && SeekTo(file, int64_t{position} + record.storedSize);
}

template <typename Pass>
StatusCode Fail(SetupContext* context, uint32_t event, const char* text, StatusCode status) {
  return Pass::kAddsEvents ? GiveUp(&context->events, event, text, status) : status;
}

template <typename Pass>
StatusCode WalkRecord(SetupContext* context, Pass& pass, int index) {
  DataFile* const file = context->packageFile;
  if (PollCancel() == 1) return StatusCancelled;
  FileRecord* const record = pass.RecordAt(index);
  if (ReadFileRecord(file, record) == 0) {
    return Fail<Pass>(context, EventBadRecord, file->GetName(), StatusBadRecord);
  }

  TargetList targets = {};
  StatusCode status =
      ResolveTargets(context, &targets, context->installDir, record, Pass::kAddsEvents);
  if (status < StatusOk) {
    FreeTargets(&targets);
    char text[kEventTextSize] = {};
    (void)FormatText(text, sizeof(text), "%s%s", TextField(record->destination).text,
                     TextField(record->fileName).text);
    return Fail<Pass>(context, EventUnresolved, text, status);
  }
  const bool hasTargets = targets.count > 0;
  status = hasTargets ? pass.Work(*record, targets) : StatusOk;
  FreeTargets(&targets);
  if (status != StatusOk) return status;

  const bool isBehindStream = Pass::kTakesStreams && hasTargets;
  if (!isBehindStream && !SkipStream(file, *record)) {
    return Fail<Pass>(context, EventReadFailed, file->GetName(), StatusReadFailed);
  }
  return StatusOk;
}

}  // namespace package_walk

// Walks all records. The context must have an open packageFile. Returns 1 when every record was
// walked, StatusSeekFailed with the package file closed and null, StatusCancelled, StatusBadRecord,
// StatusReadFailed, a negative result of ResolveTargets, or what Begin or Work gave. Browsers that
// are missing are no failure: every file that has a place on this machine is there.
template <typename Pass>
StatusCode WalkPackage(SetupContext* context, Pass& pass) {
  if (!package_walk::SeekTo(context->packageFile, context->header.dataOffset)) {
    const StatusCode status = package_walk::Fail<Pass>(
        context, EventSeekFailed, context->packageFile->GetName(), StatusSeekFailed);
    ClosePackageFile(context);
    return status;
  }
  StatusCode status = pass.Begin();
  for (int index = 0; status == StatusOk && index < context->header.recordCount; ++index) {
    status = package_walk::WalkRecord(context, pass, index);
  }
  return status;
}
