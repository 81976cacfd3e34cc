# What `cmake --install` and CPack lay down, in two shapes.
#
# The folder (`cmake --install`, and the archive of `cpack -G TGZ`), since the program keeps its files beside itself:
#
#   quorvan, help/     the program, as it lies in the folder it runs from
#   bin/               quorvan-cli; `bin/quorvan-cli setup .` completes this folder, `bin/quorvan-cli setup FOLDER`
#                      makes another one from it
#   share/             man pages, where man looks for those of a program in bin/, and the icon and metadata
#
# The system's (component "system", and the Debian package of `cpack -G DEB`), where everything has its usual place:
#
#   bin/               quorvan, which makes a person's folder and starts the program in it, and quorvan-cli
#   lib/quorvan/       the two programs that go into such a folder
#   share/             man pages, menu entry, icon, metadata
#
# There are no data files in either: unpacked over a folder in use, a new version must leave the person's alone.

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

# quorvan_system_install(what ... DESTINATION folder): for the system's shape alone.
macro(quorvan_system_install)
  install(${ARGN} COMPONENT system EXCLUDE_FROM_ALL)
endmacro()

# quorvan_compressed(variable file): the build's copy of the file, compressed as Debian wants it.
function(quorvan_compressed variable file)
  cmake_path(GET file FILENAME name)
  set(copy ${PROJECT_BINARY_DIR}/package/${name})
  add_custom_command(OUTPUT ${copy}.gz
    COMMAND ${CMAKE_COMMAND} -E copy ${PROJECT_SOURCE_DIR}/${file} ${copy}
    COMMAND gzip -9nf ${copy}
    DEPENDS ${file} VERBATIM)
  set(${variable} ${copy}.gz PARENT_SCOPE)
endfunction()

file(MAKE_DIRECTORY ${PROJECT_BINARY_DIR}/package)
file(CREATE_LINK ../lib/quorvan/quorvan-cli ${PROJECT_BINARY_DIR}/package/quorvan-cli SYMBOLIC)
quorvan_compressed(program_page doc/man/quorvan.1)
quorvan_compressed(companion_page doc/man/quorvan-cli.1)
quorvan_compressed(changelog resources/debian/changelog)
add_custom_target(quorvan_package_documents ALL DEPENDS ${program_page} ${companion_page} ${changelog})

quorvan_system_install(TARGETS quorvan quorvan-cli DESTINATION lib/quorvan)
quorvan_system_install(PROGRAMS resources/debian/quorvan DESTINATION bin)
quorvan_system_install(FILES ${PROJECT_BINARY_DIR}/package/quorvan-cli DESTINATION bin)
quorvan_system_install(FILES ${program_page} ${companion_page} DESTINATION share/man/man1)
quorvan_system_install(FILES ${changelog} DESTINATION share/doc/quorvan)
quorvan_system_install(FILES resources/icons/org.quorvan.quorvan.svg DESTINATION share/icons/hicolor/scalable/apps)
quorvan_system_install(FILES resources/desktop/org.quorvan.quorvan.metainfo.xml DESTINATION share/metainfo)
quorvan_system_install(FILES resources/desktop/org.quorvan.quorvan.desktop DESTINATION share/applications)

set(CPACK_GENERATOR TGZ)
set(CPACK_PACKAGE_FILE_NAME Quorvan-${PROJECT_VERSION}-${CMAKE_SYSTEM_NAME}-${CMAKE_SYSTEM_PROCESSOR})
set(CPACK_STRIP_FILES ON)
set(CPACK_VERBATIM_VARIABLES ON)

set(CPACK_PROJECT_CONFIG_FILE ${PROJECT_SOURCE_DIR}/cmake/QuorvanGenerators.cmake)
set(CPACK_PACKAGE_CONTACT "Quorvan maintainers <maintainers@quorvan.example>")
set(CPACK_PACKAGE_DESCRIPTION_SUMMARY "Keep your investment portfolios on your own machine")
set(CPACK_PACKAGE_DESCRIPTION "Quorvan keeps any number of investment portfolios: stocks, funds and anything
else, with shares, price and value, risk, broker, and whether it is for your
retirement. It takes prices from web pages that you name, draws charts and
prints a report. All data lies in one folder, and quorvan-cli works with it
at a shell.")
set(CPACK_DEBIAN_FILE_NAME DEB-DEFAULT)
set(CPACK_DEBIAN_PACKAGE_NAME quorvan)
set(CPACK_DEBIAN_PACKAGE_SECTION misc)
set(CPACK_DEBIAN_PACKAGE_SHLIBDEPS ON)
set(CPACK_DEBIAN_PACKAGE_RECOMMENDS "ca-certificates, fonts-dejavu-core, qt6-wayland, xdg-utils")
set(CPACK_DEBIAN_PACKAGE_SUGGESTS libnotify-bin)
set(CPACK_INSTALL_DEFAULT_DIRECTORY_PERMISSIONS
  OWNER_READ OWNER_WRITE OWNER_EXECUTE GROUP_READ GROUP_EXECUTE WORLD_READ WORLD_EXECUTE)
include(CPack)
