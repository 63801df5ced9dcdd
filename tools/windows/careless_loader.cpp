// The program that planted libraries are made for: it loads those that its command line names by
// their bare names, and so from its own folder.
#include <windows.h>

int main(int argc, char** argv) {
  for (int i = 1; i < argc; ++i) LoadLibraryA(argv[i]);
  return 0;
}
