#include "tools/image/output_file.h"

#include <string>

#include "tools/image/bad_input.h"
#include "tools/image/temporary_files.h"

namespace image {

OutputFile::OutputFile(const std::filesystem::path& target, FileKind kind) : target_(target) {
  std::error_code error;
  const auto status = std::filesystem::status(target, error);
  if (std::filesystem::exists(status) && !std::filesystem::is_regular_file(status)) {
    throw BadInput(target, "is not a plain file; name another output");
  }
  const std::filesystem::path folder = target.has_parent_path() ? target.parent_path() : ".";
  file_ = MakeTemporaryFile(folder, kind, &temporary_);
  if (file_ == nullptr) Fail(LastCallError());
}

OutputFile::~OutputFile() {
  if (file_ != nullptr) std::fclose(file_);
  std::error_code ignored;  // it can only stay behind
  if (!committed_) std::filesystem::remove(temporary_, ignored);
  ForgetTemporaryFile(temporary_);
}

void OutputFile::Write(std::span<const uint8_t> bytes) {
  if (bytes.empty()) return;  // fwrite takes no null pointer, not even for nothing
  if (std::fwrite(bytes.data(), 1, bytes.size(), file_) != bytes.size()) Fail(LastCallError());
}

void OutputFile::Close() {
  if (file_ == nullptr) return;
  std::FILE* file = file_;
  file_ = nullptr;
  if (std::fclose(file) != 0) Fail(LastCallError());
}

void OutputFile::Commit() {
  Close();
  std::error_code error;
  std::filesystem::rename(temporary_, target_, error);
  if (error) Fail(error);
  committed_ = true;
}

void OutputFile::Fail(const std::error_code& error) const {
  throw BadInput(target_, "can't be written: " + SystemReason(error));
}

}  // namespace image
