#include <iostream>

#include "tools/image/image_command_line.h"
#include "tools/image/temporary_files.h"

int main(int argc, char** argv) {
  image::DeleteTemporaryFilesWhenStopped();
  return image::RunImageTool(argc, argv, std::cout, std::cerr);
}
