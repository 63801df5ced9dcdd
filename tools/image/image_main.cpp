#include <iostream>

#include "tools/image/image_command_line.h"

int main(int argc, char** argv) {
  return image::RunImageTool(argc, argv, std::cout, std::cerr);
}
