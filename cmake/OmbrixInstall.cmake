# What `cmake --install` puts where: the programs, the framework with its sources, and what others build against.
#
# An application finds it all with find_package(ombrix) as ombrix::ombrix (the framework), ombrix::linux (this machine)
# and ombrix::described (a machine that a file describes). A source needs ombrix::ombrix alone.

include(CMakePackageConfigHelpers)
set(headers_folder ${CMAKE_INSTALL_INCLUDEDIR}/ombrix)
set(package_folder ${CMAKE_INSTALL_LIBDIR}/cmake/ombrix)

install(TARGETS ombrix_cli RUNTIME)
if(TARGET ombrix_clipboard)
  install(TARGETS ombrix_clipboard RUNTIME)
endif()
install(DIRECTORY ${CMAKE_BINARY_DIR}/lib/ombrix/plugins/Montaro.obplugin
  DESTINATION ${CMAKE_INSTALL_LIBDIR}/ombrix/plugins PATTERN OBMontaroPlugin.so EXCLUDE)
install(TARGETS OBMontaroPlugin LIBRARY DESTINATION ${CMAKE_INSTALL_LIBDIR}/ombrix/plugins/Montaro.obplugin)

foreach(target ombrix ombrix_platform ombrix_linux ombrix_described ombrix_machine_common ombrix_formats)
  string(REPLACE ombrix_ "" name ${target})
  set_target_properties(${target} PROPERTIES EXPORT_NAME ${name})
  install(TARGETS ${target} EXPORT ombrix-targets INCLUDES DESTINATION ${headers_folder})
endforeach()

file(GLOB host_headers CONFIGURE_DEPENDS ${CMAKE_SOURCE_DIR}/host/OB*.h)
file(GLOB role_headers CONFIGURE_DEPENDS ${CMAKE_SOURCE_DIR}/platform/*.h)
install(FILES ${host_headers} DESTINATION ${headers_folder}/host)
install(FILES ${role_headers} DESTINATION ${headers_folder}/platform)
install(FILES ${CMAKE_SOURCE_DIR}/platform/linux/LinuxPlatform.h DESTINATION ${headers_folder}/platform/linux)
install(FILES ${CMAKE_SOURCE_DIR}/platform/described/DescribedPlatform.h
  DESTINATION ${headers_folder}/platform/described)

install(EXPORT ombrix-targets NAMESPACE ombrix:: DESTINATION ${package_folder})
configure_package_config_file(${CMAKE_CURRENT_LIST_DIR}/ombrix-config.cmake.in ombrix-config.cmake
  INSTALL_DESTINATION ${package_folder} NO_SET_AND_CHECK_MACRO)
write_basic_package_version_file(ombrix-config-version.cmake COMPATIBILITY SameMajorVersion)
install(FILES ${CMAKE_CURRENT_BINARY_DIR}/ombrix-config.cmake ${CMAKE_CURRENT_BINARY_DIR}/ombrix-config-version.cmake
  DESTINATION ${package_folder})
