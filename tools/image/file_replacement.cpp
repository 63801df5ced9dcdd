#include "tools/image/file_replacement.h"

#include <string>
#include <system_error>

#include "tools/image/bad_input.h"

namespace image {
namespace {

namespace fs = std::filesystem;

class Replacement {
 public:
  Replacement() = default;
  // Undoes what is not kept, the last first.
  ~Replacement() {
    std::error_code ignored;  // the failure that led here is the one to tell
    for (auto step = steps_.rbegin(); step != steps_.rend(); ++step) {
      if (step->isCommitted) fs::remove(step->target, ignored);
      if (!step->aside.empty()) fs::rename(step->aside, step->target, ignored);
    }
  }
  Replacement(const Replacement&) = delete;
  Replacement& operator=(const Replacement&) = delete;

  void Commit(OutputFile* file) {
    Step& step = steps_.emplace_back(Step{file->Target(), {}, false});
    if (fs::exists(fs::symlink_status(step.target))) {
      const fs::path aside = FreeName(step.target.parent_path());
      std::error_code error;
      fs::rename(step.target, aside, error);
      if (error) throw BadInput(step.target, "can't be replaced: " + SystemReason(error));
      step.aside = aside;
    }
    file->Commit();
    step.isCommitted = true;
  }

  void Keep() {
    std::error_code ignored;  // the files are there; an old one can only stay beside them
    for (const Step& step : steps_) {
      if (!step.aside.empty()) fs::remove(step.aside, ignored);
    }
    steps_.clear();
  }

 private:
  struct Step {
    fs::path target;
    fs::path aside;  // where the old file is; "": there was none
    bool isCommitted = false;
  };

  fs::path FreeName(const fs::path& folder) {
    for (;;) {
      fs::path name = folder / (".moriv-old-" + std::to_string(++number_));
      if (!fs::exists(fs::symlink_status(name))) return name;
    }
  }

  std::vector<Step> steps_;
  unsigned number_ = 0;
};

}  // namespace

void CommitTogether(const std::vector<std::unique_ptr<OutputFile>>& files) {
  Replacement replacement;
  for (const auto& file : files) replacement.Commit(file.get());
  replacement.Keep();
}

}  // namespace image
