# What `cmake --install` puts where: the programs, the framework with its sources, and what others build against.
#
# find_package(ombrix) gives ombrix::ombrix, the framework, which is all that a source links. An application names
# components too: "linux" (this machine) and "described" (a machine that a file describes). pkg-config knows the same as
# "ombrix" and "ombrix-machines".

include(CMakePackageConfigHelpers)
set(headers_folder ${CMAKE_INSTALL_INCLUDEDIR}/ombrix)
set(package_folder ${CMAKE_INSTALL_LIBDIR}/cmake/ombrix)
set(pkgconfig_folder ${CMAKE_INSTALL_LIBDIR}/pkgconfig)
set(documents_folder ${CMAKE_INSTALL_DOCDIR})

install(TARGETS ombrix_cli RUNTIME)
if(TARGET ombrix_clipboard)
  install(TARGETS ombrix_clipboard RUNTIME)
endif()
install(DIRECTORY ${PROJECT_BINARY_DIR}/lib/ombrix/plugins/Montaro.obplugin
  DESTINATION ${CMAKE_INSTALL_LIBDIR}/ombrix/plugins PATTERN OBMontaroPlugin.so EXCLUDE)
install(TARGETS OBMontaroPlugin LIBRARY DESTINATION ${CMAKE_INSTALL_LIBDIR}/ombrix/plugins/Montaro.obplugin)

# install_exported(EXPORT TARGET...): others know ombrix_NAME as ombrix::NAME.
function(install_exported export)
  foreach(target ${ARGN})
    string(REPLACE ombrix_ "" name ${target})
    set_target_properties(${target} PROPERTIES EXPORT_NAME ${name})
    install(TARGETS ${target} EXPORT ${export} INCLUDES DESTINATION ${headers_folder})
  endforeach()
  install(EXPORT ${export} NAMESPACE ombrix:: DESTINATION ${package_folder})
endfunction()
install_exported(ombrix-framework ombrix ombrix_platform)
install_exported(ombrix-machines ombrix_linux ombrix_described ombrix_machine_common ombrix_formats)

file(GLOB host_headers CONFIGURE_DEPENDS ${PROJECT_SOURCE_DIR}/host/OB*.h)
file(GLOB role_headers CONFIGURE_DEPENDS ${PROJECT_SOURCE_DIR}/platform/*.h)
install(FILES ${host_headers} DESTINATION ${headers_folder}/host)
install(FILES ${role_headers} DESTINATION ${headers_folder}/platform)
install(FILES ${PROJECT_SOURCE_DIR}/platform/linux/LinuxPlatform.h DESTINATION ${headers_folder}/platform/linux)
install(FILES ${PROJECT_SOURCE_DIR}/platform/described/DescribedPlatform.h
  DESTINATION ${headers_folder}/platform/described)

configure_package_config_file(${CMAKE_CURRENT_LIST_DIR}/ombrix-config.cmake.in ombrix-config.cmake
  INSTALL_DESTINATION ${package_folder} NO_SET_AND_CHECK_MACRO)
write_basic_package_version_file(ombrix-config-version.cmake COMPATIBILITY SameMajorVersion)
install(FILES ${CMAKE_CURRENT_BINARY_DIR}/ombrix-config.cmake ${CMAKE_CURRENT_BINARY_DIR}/ombrix-config-version.cmake
  DESTINATION ${package_folder})

# Relative, so that an installation may be moved.
file(RELATIVE_PATH headers_from_pkgconfig /${pkgconfig_folder} /${headers_folder})
foreach(name ombrix ombrix-machines)
  configure_file(${CMAKE_CURRENT_LIST_DIR}/${name}.pc.in ${name}.pc @ONLY)
  install(FILES ${CMAKE_CURRENT_BINARY_DIR}/${name}.pc DESTINATION ${pkgconfig_folder})
endforeach()

install(FILES ${PROJECT_SOURCE_DIR}/README.md ${PROJECT_SOURCE_DIR}/LICENSE DESTINATION ${documents_folder})
install(DIRECTORY ${PROJECT_SOURCE_DIR}/docs ${PROJECT_SOURCE_DIR}/examples DESTINATION ${documents_folder})
