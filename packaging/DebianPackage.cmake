# The Debian package, made by cpack; scripts/package calls it with the preset "package".

set(documents ${CMAKE_INSTALL_FULL_DATADIR}/doc/norvex)
norvex_install_compressed(${CMAKE_CURRENT_SOURCE_DIR}/debian/changelog changelog ${documents})
install(FILES debian/copyright DESTINATION ${documents})

file(STRINGS debian/changelog newest_change LIMIT_COUNT 1)
if(NOT newest_change MATCHES "^norvex \\(${PROJECT_VERSION}\\)")
  message(FATAL_ERROR "packaging/debian/changelog has no entry for version ${PROJECT_VERSION}")
endif()

foreach(script postinst postrm)
  configure_file(debian/${script}.in ${CMAKE_CURRENT_BINARY_DIR}/debian/${script} @ONLY
                 FILE_PERMISSIONS OWNER_READ OWNER_WRITE OWNER_EXECUTE GROUP_READ GROUP_EXECUTE WORLD_READ WORLD_EXECUTE)
endforeach()
configure_file(debian/conffiles ${CMAKE_CURRENT_BINARY_DIR}/debian/conffiles COPYONLY
               FILE_PERMISSIONS OWNER_READ OWNER_WRITE GROUP_READ WORLD_READ)

set(CPACK_GENERATOR DEB)
set(CPACK_PACKAGE_NAME norvex)
set(CPACK_PACKAGE_VERSION ${PROJECT_VERSION})
set(CPACK_PACKAGE_CONTACT "The Norvex authors <maintainers@norvex.example>")
set(CPACK_SET_DESTDIR ON)
set(CPACK_STRIP_FILES ON)
set(CPACK_INSTALL_DEFAULT_DIRECTORY_PERMISSIONS
    OWNER_READ OWNER_WRITE OWNER_EXECUTE GROUP_READ GROUP_EXECUTE WORLD_READ WORLD_EXECUTE)
set(CPACK_DEBIAN_FILE_NAME DEB-DEFAULT)
set(CPACK_DEBIAN_PACKAGE_SECTION utils)
set(CPACK_PACKAGE_DESCRIPTION_SUMMARY "storage-usage agent and its companion command")
set(CPACK_DEBIAN_PACKAGE_DESCRIPTION
"The agent measures, once per release and for each user, how storage is used,
and writes coarse figures to the diagnostic log of the machine: every size
rounded up to one of ten buckets a decade, every count to two digits. It runs
from a timer of the user's service manager, and makes no network connection.

The command norvexctl shows what would be reported before it is, and where
the space went: it keeps an index of whole volumes that can be searched.")
set(CPACK_DEBIAN_PACKAGE_SHLIBDEPS ON)
# shared-mime-info tells the types of files by their names; without it only the commonest are known. The agent can be
# started by hand without systemd, and the session bus is how it switches its timer off.
set(CPACK_DEBIAN_PACKAGE_RECOMMENDS "shared-mime-info, systemd, dbus-user-session")
set(CPACK_DEBIAN_PACKAGE_CONTROL_STRICT_PERMISSION ON)
set(CPACK_DEBIAN_PACKAGE_CONTROL_EXTRA
    ${CMAKE_CURRENT_BINARY_DIR}/debian/postinst
    ${CMAKE_CURRENT_BINARY_DIR}/debian/postrm
    ${CMAKE_CURRENT_BINARY_DIR}/debian/conffiles)
include(CPack)
