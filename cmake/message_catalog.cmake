# orvane_add_catalog(TARGET PO_FILE LANGID): builds the gettext file into the target as the message catalog
# of that language. It is called in the directory that defines the target, which must be linked by its
# objects (a program or an object library). The language identifier is that of Windows: 0x0007 is German
# wherever it is spoken, 0x0407 that of Germany.
#
# The type of the resource is kCatalogType of qelutils/message_catalog.h. Its number is the language once
# more, because this linker crashes when more than two objects hold resources of one type and number that
# differ in their language. A file that msgfmt finds at fault ends the build. Entries marked fuzzy are
# left out.
function(orvane_add_catalog target po_file langid)
  find_program(MSGCONV_PROGRAM msgconv REQUIRED)
  find_program(MSGFMT_PROGRAM msgfmt REQUIRED)
  cmake_path(ABSOLUTE_PATH po_file)
  math(EXPR primary "${langid} & 0x3FF")
  math(EXPR sublanguage "${langid} >> 10")
  set(base ${CMAKE_CURRENT_BINARY_DIR}/${target}_${langid})
  add_custom_command(OUTPUT ${base}.mo
    COMMAND ${MSGCONV_PROGRAM} --to-code=UTF-8 --output-file=${base}.po ${po_file}
    COMMAND ${MSGFMT_PROGRAM} --check-format --check-header --endianness=little
      --output-file=${base}.mo ${base}.po
    DEPENDS ${po_file} VERBATIM)
  file(CONFIGURE OUTPUT ${base}.rc CONTENT
    "LANGUAGE @primary@, @sublanguage@\n@langid@ MESSAGE_CATALOG \"@base@.mo\"\n" @ONLY)
  set_source_files_properties(${base}.rc PROPERTIES OBJECT_DEPENDS ${base}.mo)
  target_sources(${target} PRIVATE ${base}.mo ${base}.rc)
endfunction()
