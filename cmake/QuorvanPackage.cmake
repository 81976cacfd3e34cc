# What `cmake --install` and CPack lay down: Quorvan's own folder, since the program keeps its files beside itself.
#
#   quorvan, help/     the program, as it lies in the folder it runs from
#   bin/               quorvan-cli; `bin/quorvan-cli setup .` completes this folder, `bin/quorvan-cli setup FOLDER`
#                      makes another one from it
#   share/             man pages, where man looks for those of a program in bin/, and the icon and metadata
#
# There are no data files in it: unpacked over a folder in use, a new version must leave the person's alone.

if(CMAKE_INSTALL_PREFIX_INITIALIZED_TO_DEFAULT)
  set(CMAKE_INSTALL_PREFIX /opt/quorvan CACHE PATH "Where the folder is installed" FORCE)
endif()

install(TARGETS quorvan DESTINATION .)
install(TARGETS quorvan-cli DESTINATION bin)
install(DIRECTORY resources/help DESTINATION .)
install(DIRECTORY doc/man/ DESTINATION share/man/man1 FILES_MATCHING PATTERN "*.1")
install(FILES resources/icons/org.quorvan.quorvan.svg DESTINATION share/icons/hicolor/scalable/apps)
install(FILES resources/desktop/org.quorvan.quorvan.metainfo.xml DESTINATION share/metainfo)
install(FILES resources/README.txt DESTINATION .)

set(CPACK_GENERATOR TGZ)
set(CPACK_PACKAGE_FILE_NAME Quorvan-${PROJECT_VERSION}-${CMAKE_SYSTEM_NAME}-${CMAKE_SYSTEM_PROCESSOR})
set(CPACK_STRIP_FILES ON)
set(CPACK_VERBATIM_VARIABLES ON)
include(CPack)
