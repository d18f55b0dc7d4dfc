# The Debian package: `make package` runs CPack on the default build and writes build/package/velmar_*.deb.
# Everything that `cmake --install` puts in place goes into the one package `velmar`, below /usr; the
# dependencies are computed from the shared libraries that the programs link (dpkg-shlibdeps).

set(CPACK_GENERATOR DEB)
set(CPACK_PACKAGE_NAME velmar)
set(CPACK_PACKAGE_VERSION ${PROJECT_VERSION})
set(CPACK_PACKAGE_VENDOR "The Velmar developers")
set(CPACK_PACKAGE_CONTACT "Velmar Developers <dev@velmar.invalid>")
set(CPACK_PACKAGING_INSTALL_PREFIX /usr)
# The programs are stripped as Debian strips them: symbols, and the .comment and .note sections that only
# name the tools that built them.
set(CPACK_STRIP_FILES ON)
set(CPACK_VELMAR_STRIP "${CMAKE_STRIP}")
set(CPACK_PRE_BUILD_SCRIPTS ${CMAKE_CURRENT_LIST_DIR}/VelmarPackageStrip.cmake)
# Directories that install() creates get 0755 whatever the umask of the build.
set(CPACK_INSTALL_DEFAULT_DIRECTORY_PERMISSIONS
    OWNER_READ OWNER_WRITE OWNER_EXECUTE GROUP_READ GROUP_EXECUTE WORLD_READ WORLD_EXECUTE)

set(CPACK_DEBIAN_FILE_NAME DEB-DEFAULT)
set(CPACK_DEBIAN_PACKAGE_SECTION comm)
set(CPACK_DEBIAN_PACKAGE_PRIORITY optional)
set(CPACK_DEBIAN_PACKAGE_SHLIBDEPS ON)
# Qt finds its display back ends as plugins at run time, which no library dependency names.
set(CPACK_DEBIAN_PACKAGE_RECOMMENDS "qt6-qpa-plugins")
set(CPACK_DEBIAN_COMPRESSION_TYPE xz)
set(CPACK_PACKAGE_DESCRIPTION_SUMMARY "Cellular radio diagnostics monitor")
set(CPACK_DEBIAN_PACKAGE_DESCRIPTION [=[Velmar shows, live, what a phone's or modem's baseband reports about the
radio network: serving and neighbour cells with their levels,
mobility-management and radio-resource states, PLMN and location, GPRS
options, HSDPA and block-error statistics, packet-data contexts and SIM
files.
.
The package holds the monitor (velmar: graphical, terminal and headless
interfaces), the telephony service that owns the baseband (kxserverd: a
simulated baseband, recorded logs or a modem's diagnostic port; a systemd
user unit runs it with the session), the offline decoder (velmar-decode),
and a udev rule that keeps ModemManager away from diagnostic ports.]=])

include(CPack)
