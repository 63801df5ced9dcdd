# Warnings are errors on all compilers.
add_compile_options(
  -Wall -Wextra -Wpedantic -Werror -Wshadow -Wconversion -Wsign-conversion -Wcast-qual
  -Wformat=2 -Wundef -Wnull-dereference -Wnon-virtual-dtor -Wold-style-cast -Wunused)
