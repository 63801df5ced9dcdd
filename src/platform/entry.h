// The program's entry, behind what each world does to start a process.
#pragma once

// Carries out the run that the process's command line asks for. Returns the exit code.
int RunProgram();
