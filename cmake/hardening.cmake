# What the native programs ask of the compiler and of the loader against their own errors;
# tools/check-hardening looks for it. The Windows builds have theirs in src/CMakeLists.txt.
if(NOT WIN32)
  include(CheckPIESupported)
  check_pie_supported()
  set(CMAKE_POSITION_INDEPENDENT_CODE ON)
  add_compile_options(-fstack-protector-strong)
  add_link_options(-Wl,-z,relro,-z,now)
  # Not beside the sanitizers, which look at the same calls themselves, and not without optimising,
  # where it does nothing but warn. A compiler may come with a value of its own.
  if(NOT MORIV_SANITIZE)
    add_compile_options($<$<NOT:$<CONFIG:Debug>>:-U_FORTIFY_SOURCE$<SEMICOLON>-D_FORTIFY_SOURCE=2>)
  endif()
endif()
