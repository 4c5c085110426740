# The program folder of the Windows build, as Qt's deployment tool would lay it out (that tool
# is not part of a cross build): the window with Qt's libraries beside it, Qt's plugins in the
# subfolders Qt looks in beside the program, and the compiler's runtime libraries that Qt and
# the window use. The command line is linked statically and needs none of them.
# Included by VtrPackaging.cmake; sets VTR_WINDOWS_HELP_FILE.

if(TARGET vantori-verifier)
    # Qt's imported targets (and its plugins') are seen only where Qt was found.
    find_package(Qt6 REQUIRED COMPONENTS Widgets)
    install(FILES $<TARGET_FILE:Qt6::Core> $<TARGET_FILE:Qt6::Gui> $<TARGET_FILE:Qt6::Widgets>
            DESTINATION .)
    install(FILES $<TARGET_FILE:Qt6::QWindowsIntegrationPlugin> DESTINATION platforms)
    install(FILES $<TARGET_FILE:Qt6::QWindowsVistaStylePlugin> DESTINATION styles)
    install(FILES $<TARGET_FILE:Qt6::QICOPlugin> DESTINATION imageformats)

    set(VTR_RUNTIME_DLLS)
    foreach(dll libstdc++-6.dll libgcc_s_seh-1.dll libwinpthread-1.dll)
        execute_process(COMMAND ${CMAKE_CXX_COMPILER} -print-file-name=${dll}
                        OUTPUT_VARIABLE path OUTPUT_STRIP_TRAILING_WHITESPACE)
        get_filename_component(path "${path}" ABSOLUTE)
        if(NOT EXISTS "${path}")
            message(FATAL_ERROR "The compiler's runtime library ${dll} was not found")
        endif()
        list(APPEND VTR_RUNTIME_DLLS "${path}")
    endforeach()
    install(FILES ${VTR_RUNTIME_DLLS} DESTINATION .)

    # The licences of Qt and of what it bundles, from the Qt build's prefix.
    if(IS_DIRECTORY "${QT6_INSTALL_PREFIX}/licenses")
        install(DIRECTORY "${QT6_INSTALL_PREFIX}/licenses/" DESTINATION licenses/Qt)
    else()
        message(WARNING "No licence texts in ${QT6_INSTALL_PREFIX}/licenses: the package will "
                        "lack Qt's")
    endif()
endif()

# The Verifier's own help: how to use the window and every message with its severity, made
# from the message catalog by the same tool that gives the demo installation its help file.
# The window's Help opens the suite's help file (VTRHelp.chm in the suite's application
# folder); this one is reached from the Start menu.
set(VTR_WINDOWS_HELP_FILE)
if(TARGET demo-help)
    set(VTR_WINDOWS_HELP_FILE VantoriVerifier.chm)
    install(FILES ${CMAKE_BINARY_DIR}/demo/app/VTRHelp.chm DESTINATION .
            RENAME ${VTR_WINDOWS_HELP_FILE})
endif()
