# Read by CPack for each generator: a Debian package is of the system's shape, an archive of the folder's (see
# QuorvanPackage.cmake).
if(CPACK_GENERATOR STREQUAL DEB)
  list(GET CPACK_INSTALL_CMAKE_PROJECTS 0 build)
  set(CPACK_INSTALL_CMAKE_PROJECTS "${build};Quorvan;system;/")
endif()
