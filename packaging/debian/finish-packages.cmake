# Run by CPack between the installation into its temporary folder and the making of the packages: brings each package
# what Debian's policy wants and an ordinary installation does not.

function(compress file)
  execute_process(COMMAND gzip -9nf ${file} COMMAND_ERROR_IS_FATAL ANY)
endfunction()

# component=package
foreach(entry ${CPACK_LUMORA_PACKAGES})
  string(REPLACE "=" ";" entry ${entry})
  list(GET entry 0 component)
  list(GET entry 1 package)
  set(usr ${CPACK_TEMPORARY_DIRECTORY}/${component}/usr)
  file(COPY ${CMAKE_CURRENT_LIST_DIR}/copyright ${CMAKE_CURRENT_LIST_DIR}/changelog DESTINATION ${usr}/share/doc/${package}
       FILE_PERMISSIONS OWNER_READ OWNER_WRITE GROUP_READ WORLD_READ)
  compress(${usr}/share/doc/${package}/changelog)
  if(EXISTS ${CMAKE_CURRENT_LIST_DIR}/${package}.lintian-overrides)
    file(COPY_FILE ${CMAKE_CURRENT_LIST_DIR}/${package}.lintian-overrides ${usr}/share/lintian/overrides/${package})
  endif()
  file(GLOB pages ${usr}/share/man/man*/*.[1-8])
  foreach(page ${pages})
    compress(${page})
  endforeach()
endforeach()
