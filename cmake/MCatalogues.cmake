# Translations of a program or library: each FOLDER/po/LANGUAGE.po becomes DOMAIN.mo in the build tree, below
# `prefix`, as in an installed tree.
include(GNUInstallDirs)
find_program(MSGFMT_PROGRAM msgfmt)

function(m_catalogues domain prefix component)
  if(NOT MSGFMT_PROGRAM)
    message(STATUS "msgfmt is not installed: messages of ${domain} will be in English only")
    return()
  endif()
  foreach(language de fr ja)
    set(source ${CMAKE_CURRENT_SOURCE_DIR}/po/${language}.po)
    set(folder ${prefix}/${CMAKE_INSTALL_LOCALEDIR}/${language}/LC_MESSAGES)
    file(MAKE_DIRECTORY ${folder})
    add_custom_command(OUTPUT ${folder}/${domain}.mo
      COMMAND ${MSGFMT_PROGRAM} --check-format --output-file=${folder}/${domain}.mo ${source}
      DEPENDS ${source})
    list(APPEND catalogues ${folder}/${domain}.mo)
    if(M_INSTALL)
      install(FILES ${folder}/${domain}.mo DESTINATION ${CMAKE_INSTALL_LOCALEDIR}/${language}/LC_MESSAGES COMPONENT ${component})
    endif()
  endforeach()
  add_custom_target(${domain}_catalogues ALL DEPENDS ${catalogues})
endfunction()
