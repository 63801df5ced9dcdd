# One resource source for all builds: windres makes a .res file of it; the Windows builds link that
# as a COFF object, the native build embeds the very same bytes in the section ".moriv_res".
#
#   add_program_resources(TARGET FILE.rc DEPENDENCY...)
#
# A native program that has them without being the setup program sets MORIV_RESOURCE_SECTION to
# another name, so that its file is not taken for one.
set(MORIV_RESOURCE_SECTION .moriv_res)
find_program(MORIV_WINDRES i686-w64-mingw32-windres REQUIRED)

function(add_program_resources target source)
  get_filename_component(name ${source} NAME_WE)
  get_filename_component(folder ${source} DIRECTORY)
  set(res ${CMAKE_CURRENT_BINARY_DIR}/${name}.res)
  add_custom_command(
    OUTPUT ${res}
    COMMAND ${MORIV_WINDRES} -c 65001 -I ${folder}
            -D MORIV_VERSION_NUMBERS=${PROJECT_VERSION_MAJOR},${PROJECT_VERSION_MINOR},${PROJECT_VERSION_PATCH},0
            -D MORIV_VERSION_TEXT=${PROJECT_VERSION}
            -O res -i ${source} -o ${res}
    DEPENDS ${source} ${ARGN}
    VERBATIM)
  if(WIN32)
    set(object ${CMAKE_CURRENT_BINARY_DIR}/${name}.res.o)
    if(CMAKE_SYSTEM_PROCESSOR STREQUAL i686)
      set(format pe-i386)
    else()
      set(format pe-x86-64)
    endif()
    add_custom_command(
      OUTPUT ${object}
      COMMAND ${CMAKE_RC_COMPILER} -J res -O coff -F ${format} -i ${res} -o ${object}
      DEPENDS ${res}
      VERBATIM)
    target_sources(${target} PRIVATE ${object})
    set_source_files_properties(${object} PROPERTIES EXTERNAL_OBJECT ON GENERATED ON)
  else()
    set(embed ${CMAKE_CURRENT_BINARY_DIR}/${name}_res.S)
    # Written only when it differs, since all that is linked with it would be linked again.
    file(CONFIGURE OUTPUT ${embed} CONTENT
"    .section ${MORIV_RESOURCE_SECTION},\"a\",@progbits
    .balign 4
    .globl moriv_resources_begin
moriv_resources_begin:
    .incbin \"${res}\"
    .globl moriv_resources_end
moriv_resources_end:
    .section .note.GNU-stack,\"\",@progbits
")
    set_source_files_properties(${embed} PROPERTIES LANGUAGE ASM OBJECT_DEPENDS ${res})
    target_sources(${target} PRIVATE ${embed})
  endif()
endfunction()
