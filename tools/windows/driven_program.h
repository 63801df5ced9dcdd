// The setup program that the driver has started, and the report on its run.
#pragma once

#include <windows.h>
// After windows.h.
#include <functional>
#include <string>

inline constexpr DWORD kStepTime = 20;   // milliseconds between two looks
inline constexpr int kMostLooks = 1500;  // half a minute, for one line

// The report is a file, made anew. False when it can't be.
bool OpenReport(const char* path);
// A line of the report.
void Print(const std::string& line);
// Ends the program and the driver, with a last line that says why.
[[noreturn]] void Fail(const std::string& what);
// Gives the program the time to draw what it has to.
void LetDraw();
// Lets somebody outside take a picture of the display: the file REPORT.NAME tells that it is taken.
void WaitForPicture(const std::string& name);

bool StartProgram(const char* path, std::string commandLine);
const PROCESS_INFORMATION& DrivenProcess();

// Calls `use` with the address, in the program's own memory, of a copy of these bytes.
void WithCopyInProgram(const void* bytes, size_t size, const std::function<void(void*)>& use);
// Has the program load a library, as anything does that runs in it and knows a library's name.
void LoadLibraryInProgram(const std::string& name);

bool HasEnded();
int ExitCodeOfProgram();
