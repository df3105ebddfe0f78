# Run by CPack before it packs: Debian's manual pages and change logs are compressed.
file(GLOB_RECURSE files "${CPACK_TEMPORARY_DIRECTORY}/*")
list(FILTER files INCLUDE REGEX "/man/man[1-9]/[^/]*[1-9]$|/doc/[^/]*/changelog$")
foreach(file IN LISTS files)
  execute_process(COMMAND gzip -9nf "${file}" COMMAND_ERROR_IS_FATAL ANY)
endforeach()
