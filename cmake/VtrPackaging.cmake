# What `cmake --install` puts where, and the packages CPack makes from it.
#
# On Linux, the layout of a Debian package below the install prefix (/usr for the package):
# the programs in bin/, the desktop entry, its icon in the hicolor theme, the AppStream
# metadata, the manual pages and the README. `cpack` (in the build folder) makes
# vantori-verifier_VERSION_ARCH.deb, its dependencies worked out by dpkg-shlibdeps.
#
# On Windows (the mingw-w64 cross build), the layout of a program folder: the two programs
# with the Qt libraries, Qt's plugins in the subfolders Qt looks in beside the program
# (platforms/, styles/, imageformats/), the compiler's runtime libraries, the Verifier's
# help file and the licences of what is bundled. `cpack` makes the NSIS installer
# vantori-verifier-VERSION-win64.exe and the portable vantori-verifier-VERSION-win64.zip.
# The programs' own install rules are in src/cli and src/ui.

set(VTR_PACKAGING_DIR ${PROJECT_SOURCE_DIR}/packaging)
set(VTR_PACKAGE_NAME vantori-verifier)
set(VTR_APP_ID org.vantori.verifier)

set(CPACK_PACKAGE_NAME ${VTR_PACKAGE_NAME})
# The publisher's name is also the installer's registry key, "Software\<vendor>\...": it must
# never be the suite's own key, Software\Vantori.
set(CPACK_PACKAGE_VENDOR "Vantori Verifier developers")
set(CPACK_PACKAGE_CONTACT "Vantori Dev <dev@vantori.example>")
set(CPACK_PACKAGE_VERSION ${PROJECT_VERSION})
set(CPACK_PACKAGE_DESCRIPTION_SUMMARY
    "Finds what will go wrong in a Vantori show-lighting installation before the show runs")
set(CPACK_PACKAGE_DESCRIPTION_FILE ${VTR_PACKAGING_DIR}/description.txt)
set(CPACK_PACKAGE_INSTALL_DIRECTORY "Vantori Verifier")
set(CPACK_PACKAGE_CHECKSUM SHA256)
# What the package holds and under which licences; the installer shows no licence page.
set(CPACK_RESOURCE_FILE_LICENSE ${VTR_PACKAGING_DIR}/windows/NOTICE.txt)
set(CPACK_NSIS_LICENSE_PAGE "; no licence page")
set(CPACK_STRIP_FILES ON)

# The copyright files of the libraries built into the programs, as Debian ships them
# (packages: the -dev packages of the build), installed as DESTINATION/<name>.txt.
function(vtr_install_copyright_files destination)
    foreach(entry IN LISTS ARGN)
        string(REPLACE "=" ";" entry "${entry}")
        list(GET entry 0 name)
        list(GET entry 1 package)
        set(file /usr/share/doc/${package}/copyright)
        if(EXISTS ${file})
            install(FILES ${file} DESTINATION ${destination} RENAME ${name}.txt)
        else()
            message(WARNING "${file} is missing: the package will lack the licence of ${name}")
        endif()
    endforeach()
endfunction()

if(WIN32)
    include(VtrWindowsDeploy)
    install(FILES ${VTR_PACKAGING_DIR}/windows/NOTICE.txt DESTINATION .)
    vtr_install_copyright_files(licenses CLI11=libcli11-dev nlohmann-json=nlohmann-json3-dev
        pugixml=libpugixml-dev zlib=libz-mingw-w64-dev gcc-runtime=gcc-mingw-w64-base
        mingw-w64-runtime=mingw-w64-common)

    set(CPACK_GENERATOR NSIS64 ZIP)
    set(CPACK_PACKAGE_FILE_NAME ${VTR_PACKAGE_NAME}-${PROJECT_VERSION}-win64)
    set(CPACK_PACKAGE_INSTALL_REGISTRY_KEY "Vantori Verifier")
    set(CPACK_NSIS_PACKAGE_NAME "Vantori Verifier")
    set(CPACK_NSIS_DISPLAY_NAME "Vantori Verifier")
    set(CPACK_NSIS_CONTACT "${CPACK_PACKAGE_CONTACT}")
    # A 64-bit installer, as the programs are (NSIS makes 32-bit ones unless told), with the
    # Unicode strings of the program folder's and Start menu's names. The uninstaller deletes
    # the installer's key, Software\<vendor>\Vantori Verifier, but leaves the vendor's key
    # above it: once everything else is gone, it goes too when nothing else is in it.
    set(CPACK_NSIS_DEFINES
        "  Target amd64-unicode\n\
Function un.onUninstSuccess\n\
  DeleteRegKey /ifempty HKLM 'Software\\${CPACK_PACKAGE_VENDOR}'\n\
  DeleteRegKey /ifempty HKCU 'Software\\${CPACK_PACKAGE_VENDOR}'\n\
FunctionEnd")
    set(CPACK_NSIS_MUI_ICON ${VTR_PACKAGING_DIR}/icons/vantori-verifier.ico)
    set(CPACK_NSIS_MUI_UNIICON ${VTR_PACKAGING_DIR}/icons/vantori-verifier.ico)
    set(CPACK_NSIS_INSTALLED_ICON_NAME vantori-verifier.exe)
    set(CPACK_NSIS_UNINSTALL_NAME Uninstall)
    set(CPACK_NSIS_ENABLE_UNINSTALL_BEFORE_INSTALL ON)
    # The programs are in the program folder itself, not in a bin/ below it.
    set(CPACK_NSIS_EXECUTABLES_DIRECTORY .)
    # The Start menu: the window, under its own name, and the Verifier's help.
    if(TARGET vantori-verifier)
        set(CPACK_PACKAGE_EXECUTABLES vantori-verifier "Vantori Verifier")
    endif()
    if(VTR_WINDOWS_HELP_FILE)
        set(CPACK_NSIS_MENU_LINKS ${VTR_WINDOWS_HELP_FILE} "Vantori Verifier Help")
    endif()
    # Besides what it installed, the uninstaller removes the window's own settings file of
    # the user who uninstalls (and its folder when nothing else is in it). The suite's
    # settings are never touched.
    file(READ ${VTR_PACKAGING_DIR}/windows/uninstall-extra.nsh CPACK_NSIS_EXTRA_UNINSTALL_COMMANDS)
    set_property(DIRECTORY APPEND PROPERTY CMAKE_CONFIGURE_DEPENDS
                 ${VTR_PACKAGING_DIR}/windows/uninstall-extra.nsh)
    # The ZIP holds one folder, named as the file.
    set(CPACK_INCLUDE_TOPLEVEL_DIRECTORY ON)
else()
    include(GNUInstallDirs)
    set(VTR_DOC_DIR ${CMAKE_INSTALL_DATADIR}/doc/${VTR_PACKAGE_NAME})

    set(VTR_MAN_PAGES vantori-verify.1)
    if(TARGET vantori-verifier)
        install(FILES ${VTR_PACKAGING_DIR}/linux/vantori-verifier.desktop
                DESTINATION ${CMAKE_INSTALL_DATADIR}/applications)
        install(FILES ${VTR_PACKAGING_DIR}/icons/vantori-verifier.svg
                DESTINATION ${CMAKE_INSTALL_DATADIR}/icons/hicolor/scalable/apps)
        foreach(size 16 24 32 48 64 128 256)
            install(FILES ${VTR_PACKAGING_DIR}/icons/vantori-verifier-${size}.png
                    DESTINATION ${CMAKE_INSTALL_DATADIR}/icons/hicolor/${size}x${size}/apps
                    RENAME vantori-verifier.png)
        endforeach()

        # The metadata's release is the project's version, dated by SOURCE_DATE_EPOCH when it
        # is set (reproducible packages), else by the day of the build.
        string(TIMESTAMP VTR_RELEASE_DATE "%Y-%m-%d" UTC)
        configure_file(${VTR_PACKAGING_DIR}/linux/${VTR_APP_ID}.metainfo.xml.in
                       ${CMAKE_BINARY_DIR}/packaging/${VTR_APP_ID}.metainfo.xml @ONLY)
        install(FILES ${CMAKE_BINARY_DIR}/packaging/${VTR_APP_ID}.metainfo.xml
                DESTINATION ${CMAKE_INSTALL_DATADIR}/metainfo)
        list(APPEND VTR_MAN_PAGES vantori-verifier.1)
    endif()

    # Manual pages, compressed as Debian keeps them (gzip -9n: no name or time inside).
    find_program(VTR_GZIP gzip REQUIRED)
    foreach(page IN LISTS VTR_MAN_PAGES)
        configure_file(${VTR_PACKAGING_DIR}/linux/${page} ${CMAKE_BINARY_DIR}/packaging/${page}
                       @ONLY)
        execute_process(COMMAND ${VTR_GZIP} -9nc ${CMAKE_BINARY_DIR}/packaging/${page}
                        OUTPUT_FILE ${CMAKE_BINARY_DIR}/packaging/${page}.gz
                        COMMAND_ERROR_IS_FATAL ANY)
        install(FILES ${CMAKE_BINARY_DIR}/packaging/${page}.gz
                DESTINATION ${CMAKE_INSTALL_MANDIR}/man1)
    endforeach()

    install(FILES ${PROJECT_SOURCE_DIR}/README.md ${VTR_PACKAGING_DIR}/linux/copyright
            DESTINATION ${VTR_DOC_DIR})
    vtr_install_copyright_files(${VTR_DOC_DIR}/licenses CLI11=libcli11-dev
        nlohmann-json=nlohmann-json3-dev)

    set(CPACK_GENERATOR DEB)
    set(CPACK_PACKAGING_INSTALL_PREFIX /usr)
    set(CPACK_DEBIAN_FILE_NAME DEB-DEFAULT)
    set(CPACK_DEBIAN_PACKAGE_SECTION utils)
    set(CPACK_DEBIAN_PACKAGE_PRIORITY optional)
    # The libraries the programs link come from dpkg-shlibdeps; Qt's platform plugins, which
    # the window loads at run time, are named here.
    set(CPACK_DEBIAN_PACKAGE_SHLIBDEPS ON)
    if(TARGET vantori-verifier)
        set(CPACK_DEBIAN_PACKAGE_DEPENDS qt6-qpa-plugins)
    endif()
    set(CPACK_DEBIAN_PACKAGE_CONTROL_STRICT_PERMISSION ON)
endif()

include(CPack)
