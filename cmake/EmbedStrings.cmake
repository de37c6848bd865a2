# Compiles the strings tables of a folder (<language>.lproj/Localizable.strings) into a target. A malformed table fails
# the build with its file and line.

add_executable(lumora-embed-strings ${CMAKE_CURRENT_LIST_DIR}/embed-strings.cpp)
target_link_libraries(lumora-embed-strings PRIVATE lumora-compile)

function(lumora_embed_strings target folder)
  file(GLOB tables CONFIGURE_DEPENDS ${folder}/*.lproj/Localizable.strings)
  set(output ${CMAKE_CURRENT_BINARY_DIR}/LocalizedTables.cpp)
  add_custom_command(
    OUTPUT ${output}
    COMMAND lumora-embed-strings ${output} ${tables}
    DEPENDS lumora-embed-strings ${tables}
    COMMENT "Compiling the strings tables"
    VERBATIM)
  target_sources(${target} PRIVATE ${output})
endfunction()
