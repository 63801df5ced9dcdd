#include <iostream>

#include "tools/machine/machine_command_line.h"

int main(int argc, char** argv) {
  return machine_tool::RunMachineTool(argc, argv, std::cout, std::cerr);
}
