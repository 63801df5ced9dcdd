// The tool under Windows: its arguments and its console in UTF-8, its streams byte for byte as on
// other hosts.
#include <fcntl.h>
#include <io.h>
#include <windows.h>
// Behind windows.h.
#include <shellapi.h>

#include <iostream>
#include <memory>
#include <string>
#include <vector>

#include "tools/image/image_command_line.h"
#include "tools/image/temporary_files.h"

namespace image {
namespace {

std::string ToUtf8(const wchar_t* text) {
  const int size = WideCharToMultiByte(CP_UTF8, 0, text, -1, nullptr, 0, nullptr, nullptr);
  std::string utf8(static_cast<size_t>(size), '\0');
  WideCharToMultiByte(CP_UTF8, 0, text, -1, utf8.data(), size, nullptr, nullptr);
  utf8.pop_back();  // the NUL
  return utf8;
}

std::wstring ToUtf16(const std::string& text) {
  const auto size = static_cast<int>(text.size());
  std::wstring wide(text.size(), L'\0');
  const int count = MultiByteToWideChar(CP_UTF8, 0, text.data(), size, wide.data(), size);
  wide.resize(static_cast<size_t>(count));
  return wide;
}

std::vector<std::string> ReadArguments() {
  int count = 0;
  LPWSTR* const words = CommandLineToArgvW(GetCommandLineW(), &count);
  std::vector<std::string> arguments;
  for (int i = 0; i < count; ++i) arguments.push_back(ToUtf8(words[i]));
  LocalFree(words);
  return arguments;
}

// Writes UTF-8 to a console, whatever code page that has.
class ConsoleBuffer : public std::streambuf {
 public:
  explicit ConsoleBuffer(HANDLE console) : console_(console) {}
  ~ConsoleBuffer() override { Flush(); }

 protected:
  int_type overflow(int_type c) override {
    if (traits_type::eq_int_type(c, traits_type::eof())) return traits_type::not_eof(c);
    pending_ += traits_type::to_char_type(c);
    // A line is never cut within a character.
    return c != '\n' || Flush() ? c : traits_type::eof();
  }
  int sync() override { return Flush() ? 0 : -1; }

 private:
  bool Flush() {
    const std::wstring text = ToUtf16(pending_);
    pending_.clear();
    DWORD count = 0;
    return WriteConsoleW(console_, text.data(), static_cast<DWORD>(text.size()), &count, nullptr) !=
           FALSE;
  }

  HANDLE console_;
  std::string pending_;
};

// Gives a stream the console behind its standard handle, if there is one, for as long as it lives.
class ConsoleStream {
 public:
  ConsoleStream(std::ostream* stream, DWORD standardHandle) : stream_(stream) {
    const HANDLE handle = GetStdHandle(standardHandle);
    DWORD mode = 0;
    if (GetConsoleMode(handle, &mode) == FALSE) return;
    console_ = std::make_unique<ConsoleBuffer>(handle);
    plain_ = stream->rdbuf(console_.get());
  }
  ~ConsoleStream() {
    if (console_) stream_->rdbuf(plain_);
  }
  ConsoleStream(const ConsoleStream&) = delete;
  ConsoleStream& operator=(const ConsoleStream&) = delete;

 private:
  std::ostream* stream_;
  std::streambuf* plain_ = nullptr;
  std::unique_ptr<ConsoleBuffer> console_;
};

int RunOnWindows() {
  for (std::FILE* const stream : {stdin, stdout, stderr}) _setmode(_fileno(stream), _O_BINARY);
  const ConsoleStream out(&std::cout, STD_OUTPUT_HANDLE);
  const ConsoleStream err(&std::cerr, STD_ERROR_HANDLE);
  DeleteTemporaryFilesWhenStopped();
  const std::vector<std::string> arguments = ReadArguments();
  std::vector<const char*> argv;
  for (const std::string& argument : arguments) argv.push_back(argument.c_str());
  return RunImageTool(static_cast<int>(argv.size()), argv.data(), std::cout, std::cerr);
}

}  // namespace
}  // namespace image

int main() {
  return image::RunOnWindows();
}
