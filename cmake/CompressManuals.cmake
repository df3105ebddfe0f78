# Run by CPack before it packs: Debian's manual pages and change logs are compressed.
file(GLOB_RECURSE files
  "${CPACK_TEMPORARY_DIRECTORY}/*/share/man/*.[1-9]" "${CPACK_TEMPORARY_DIRECTORY}/*/changelog")
foreach(file IN LISTS files)
  execute_process(COMMAND gzip -9nf "${file}" COMMAND_ERROR_IS_FATAL ANY)
endforeach()
