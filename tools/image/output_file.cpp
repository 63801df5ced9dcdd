#include "tools/image/output_file.h"

#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <string>

#include "tools/image/bad_input.h"
#include "tools/image/temporary_files.h"

namespace image {
namespace {

// What open() would have given; mkstemp knows nothing of the umask.
mode_t UsualMode(OutputFile::Kind kind) {
  const mode_t mask = umask(0);
  umask(mask);
  return (kind == OutputFile::Kind::kProgram ? 0777 : 0666) & ~mask;
}

}  // namespace

OutputFile::OutputFile(const std::filesystem::path& target, Kind kind) : target_(target) {
  std::error_code error;
  const auto status = std::filesystem::status(target, error);
  if (std::filesystem::exists(status) && !std::filesystem::is_regular_file(status)) {
    throw BadInput(target, "is not a plain file; name another output");
  }
  const std::filesystem::path folder = target.has_parent_path() ? target.parent_path() : ".";
  std::string name = (folder / ".moriv-XXXXXX").string();
  const int descriptor = MakeTemporaryFile(&name);
  if (descriptor < 0) Fail(errno);
  temporary_ = name;
  fchmod(descriptor, UsualMode(kind));
  file_ = fdopen(descriptor, "wb");
  if (file_ == nullptr) {
    const int reason = errno;
    close(descriptor);
    unlink(temporary_.c_str());
    ForgetTemporaryFile(temporary_);
    Fail(reason);
  }
}

OutputFile::~OutputFile() {
  if (file_ != nullptr) std::fclose(file_);
  if (!committed_) unlink(temporary_.c_str());
  ForgetTemporaryFile(temporary_);
}

void OutputFile::Write(std::span<const uint8_t> bytes) {
  if (bytes.empty()) return;  // fwrite takes no null pointer, not even for nothing
  if (std::fwrite(bytes.data(), 1, bytes.size(), file_) != bytes.size()) Fail(errno);
}

void OutputFile::Close() {
  if (file_ == nullptr) return;
  std::FILE* file = file_;
  file_ = nullptr;
  if (std::fclose(file) != 0) Fail(errno);
}

void OutputFile::Commit() {
  Close();
  if (std::rename(temporary_.c_str(), target_.c_str()) != 0) Fail(errno);
  committed_ = true;
}

void OutputFile::Fail(int error) const {
  throw BadInput(target_, "can't be written: " + SystemReason(error));
}

}  // namespace image
