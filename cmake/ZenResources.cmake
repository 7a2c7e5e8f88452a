# Each folder under a resources directory becomes one resource tree, named
# after the folder (a plug-in class) and compiled into the target. The trees
# are registered explicitly by the library's entry, not by static
# initialisers, so the resource compiler's initializer is cut from its output.
# Writes ZenResourceTrees.h with ZEN_RESOURCE_TREES(X), one X(name) per tree.

function(zen_add_resource_trees target resources_dir)
  set(out_dir ${CMAKE_CURRENT_BINARY_DIR}/resources)
  file(MAKE_DIRECTORY ${out_dir})
  file(GLOB entries LIST_DIRECTORIES true CONFIGURE_DEPENDS ${resources_dir}/*)
  list(SORT entries)
  set(tree_list "")
  foreach(dir ${entries})
    if(NOT IS_DIRECTORY ${dir})
      continue()
    endif()
    get_filename_component(name ${dir} NAME)
    file(GLOB_RECURSE files CONFIGURE_DEPENDS ${dir}/*)
    list(SORT files)
    set(qrc_content "<RCC>\n  <qresource prefix=\"/\">\n")
    foreach(f ${files})
      file(RELATIVE_PATH alias ${resources_dir} ${f})
      string(APPEND qrc_content "    <file alias=\"${alias}\">${f}</file>\n")
    endforeach()
    string(APPEND qrc_content "  </qresource>\n</RCC>\n")
    set(qrc ${out_dir}/${name}.qrc)
    file(CONFIGURE OUTPUT ${qrc} CONTENT "${qrc_content}" @ONLY)
    set(cpp ${out_dir}/qrc_${name}.cpp)
    add_custom_command(
      OUTPUT ${cpp}
      COMMAND Qt5::rcc --name ${name} -compress 9 -o ${cpp}.raw ${qrc}
      COMMAND ${CMAKE_COMMAND} -DIN=${cpp}.raw -DOUT=${cpp} -P ${ZEN_CMAKE_DIR}/StripRccInitializer.cmake
      DEPENDS ${files} ${qrc} ${ZEN_CMAKE_DIR}/StripRccInitializer.cmake
      COMMENT "Resource tree ${name}"
      VERBATIM)
    target_sources(${target} PRIVATE ${cpp})
    string(APPEND tree_list " X(${name})")
  endforeach()
  set(header ${CMAKE_CURRENT_BINARY_DIR}/generated/ZenResourceTrees.h)
  file(CONFIGURE OUTPUT ${header}
       CONTENT "// Generated: one X(name) per resource tree.\n#pragma once\n#define ZEN_RESOURCE_TREES(X)${tree_list}\n")
  target_include_directories(${target} PRIVATE ${CMAKE_CURRENT_BINARY_DIR}/generated)
endfunction()

set(ZEN_CMAKE_DIR ${CMAKE_CURRENT_LIST_DIR} CACHE INTERNAL "")

# Ninja's incremental moc step does not notice sources that a re-glob adds;
# a file listing them, rewritten only when the list changes, makes it rerun.
function(zen_automoc_follows_sources target)
  get_target_property(sources ${target} SOURCES)
  string(REPLACE ";" "\n" listing "${sources}")
  set(list_file ${CMAKE_CURRENT_BINARY_DIR}/${target}_sources.txt)
  file(CONFIGURE OUTPUT ${list_file} CONTENT "${listing}\n")
  set_property(TARGET ${target} APPEND PROPERTY AUTOGEN_TARGET_DEPENDS ${list_file})
endfunction()
