# The installed package: every shipped module's library and headers, two umbrella targets
# (VantaCurveEditor::Core, no Qt; VantaCurveEditor::Qt, the adapter on top of it) and a config
# file with its version file, for find_package(VantaCurveEditor COMPONENTS Core Qt).
include(CMakePackageConfigHelpers)

set(VCE_INSTALL_CMAKEDIR ${CMAKE_INSTALL_LIBDIR}/cmake/VantaCurveEditor)
get_property(vce_core_targets GLOBAL PROPERTY VCE_PACKAGE_Core_TARGETS)
get_property(vce_qt_targets GLOBAL PROPERTY VCE_PACKAGE_Qt_TARGETS)

add_library(vce_package_core INTERFACE)
set_target_properties(vce_package_core PROPERTIES EXPORT_NAME Core)
target_link_libraries(vce_package_core INTERFACE ${vce_core_targets})
add_library(VantaCurveEditor::Core ALIAS vce_package_core)

add_library(vce_package_qt INTERFACE)
set_target_properties(vce_package_qt PROPERTIES EXPORT_NAME Qt)
target_link_libraries(vce_package_qt INTERFACE vce_package_core ${vce_qt_targets})
add_library(VantaCurveEditor::Qt ALIAS vce_package_qt)

install(TARGETS ${vce_core_targets} vce_package_core EXPORT VantaCurveEditorCoreTargets
        ARCHIVE DESTINATION ${CMAKE_INSTALL_LIBDIR} COMPONENT Core)
install(EXPORT VantaCurveEditorCoreTargets NAMESPACE VantaCurveEditor::
        DESTINATION ${VCE_INSTALL_CMAKEDIR} COMPONENT Core)
install(TARGETS ${vce_qt_targets} vce_package_qt EXPORT VantaCurveEditorQtTargets
        ARCHIVE DESTINATION ${CMAKE_INSTALL_LIBDIR} COMPONENT Qt)
install(EXPORT VantaCurveEditorQtTargets NAMESPACE VantaCurveEditor::
        DESTINATION ${VCE_INSTALL_CMAKEDIR} COMPONENT Qt)

configure_package_config_file(
  ${CMAKE_CURRENT_LIST_DIR}/VantaCurveEditorConfig.cmake.in
  ${CMAKE_CURRENT_BINARY_DIR}/VantaCurveEditorConfig.cmake
  INSTALL_DESTINATION ${VCE_INSTALL_CMAKEDIR})
# Before 1.0 a minor version may change the interface.
write_basic_package_version_file(
  ${CMAKE_CURRENT_BINARY_DIR}/VantaCurveEditorConfigVersion.cmake
  COMPATIBILITY SameMinorVersion)
install(FILES ${CMAKE_CURRENT_BINARY_DIR}/VantaCurveEditorConfig.cmake
              ${CMAKE_CURRENT_BINARY_DIR}/VantaCurveEditorConfigVersion.cmake
        DESTINATION ${VCE_INSTALL_CMAKEDIR} COMPONENT Core)
