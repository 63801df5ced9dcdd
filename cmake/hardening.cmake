# What the native programs ask of the compiler and of the loader against their own errors;
# tools/check-hardening looks for it. The Windows builds have theirs in src/CMakeLists.txt.
if(NOT WIN32)
  # CMake's own setting compiles libraries as if they were shared, which is slower.
  add_compile_options(-fPIE -fstack-protector-strong)
  add_link_options(-pie -Wl,-z,relro,-z,now)
  # Not beside the sanitizers, which look at the same calls themselves, and not without optimising,
  # where it does nothing but warn. A compiler may come with a value of its own.
  if(NOT MORIV_SANITIZE)
    add_compile_options($<$<NOT:$<CONFIG:Debug>>:-U_FORTIFY_SOURCE$<SEMICOLON>-D_FORTIFY_SOURCE=2>)
  endif()
endif()
