# Helpers shared by the folders' CMakeLists.

set(Q19_CORE_QT Qt6::Core Qt6::Sql Qt6::SerialPort Qt6::Network)
set_property(GLOBAL PROPERTY Q19_CORE_LIBS "")

# q19_core_library(<name> SOURCES ... [DEPENDS <core libs>...])
# A static library of the core layer. It may link Qt's non-GUI modules and
# other core libraries only; q19_check_core_layer() refuses anything else.
function(q19_core_library name)
  cmake_parse_arguments(ARG "" "" "SOURCES;DEPENDS" ${ARGN})
  add_library(${name} STATIC ${ARG_SOURCES})
  target_include_directories(${name} PUBLIC ${PROJECT_SOURCE_DIR}/src)
  target_link_libraries(${name} PUBLIC ${Q19_CORE_QT} ${ARG_DEPENDS})
  target_link_libraries(q19core INTERFACE ${name})
  set_property(GLOBAL APPEND PROPERTY Q19_CORE_LIBS ${name})
endfunction()

# Tests see only the fonts that scripts/install-deps installs (the folders of
# its font packages), so that a font someone happens to have installed can
# never hide a report or a view that lays out wrongly on a fresh machine.
set(Q19_TEST_FONT_DIRS /usr/share/fonts/truetype/dejavu /usr/share/fonts/truetype/liberation2)
set(Q19_TEST_FONTS_CONF ${PROJECT_BINARY_DIR}/test-fonts/fonts.conf)
set(_fonts_xml "<?xml version=\"1.0\"?>\n<!DOCTYPE fontconfig SYSTEM \"fonts.dtd\">\n<fontconfig>\n")
foreach(dir IN LISTS Q19_TEST_FONT_DIRS)
  string(APPEND _fonts_xml "  <dir>${dir}</dir>\n")
endforeach()
# The system's rules for aliases and rendering, but not the user's own fonts.
foreach(conf 10-hinting-slight 10-scale-bitmap-fonts 30-metric-aliases 45-generic 45-latin 49-sansserif
             57-dejavu-sans-mono 57-dejavu-sans 57-dejavu-serif 60-generic 60-latin 90-synthetic)
  string(APPEND _fonts_xml "  <include ignore_missing=\"yes\">/etc/fonts/conf.d/${conf}.conf</include>\n")
endforeach()
string(APPEND _fonts_xml "  <cachedir>${PROJECT_BINARY_DIR}/test-fonts/cache</cachedir>\n</fontconfig>\n")
file(CONFIGURE OUTPUT ${Q19_TEST_FONTS_CONF} CONTENT "${_fonts_xml}")

# q19_add_test(<name> SOURCES ... LIBS ... [GUI])
# A Qt Test executable registered with CTest. GUI tests run on the offscreen
# platform so that they need no display.
function(q19_add_test name)
  cmake_parse_arguments(ARG "GUI" "" "SOURCES;LIBS" ${ARGN})
  add_executable(${name} ${ARG_SOURCES})
  target_link_libraries(${name} PRIVATE Qt6::Test ${ARG_LIBS})
  add_test(NAME ${name} COMMAND ${name})
  set(env "QT_QPA_PLATFORM=offscreen;Q19_TEST_SOURCE_DIR=${PROJECT_SOURCE_DIR};FONTCONFIG_FILE=${Q19_TEST_FONTS_CONF}")
  set_tests_properties(${name} PROPERTIES ENVIRONMENT "${env}" TIMEOUT 300)
endfunction()

# The core layer must never pull in the widget stack: engines are tested and
# run headless, and q19ctl/q19sim run on machines without a display.
function(q19_check_core_layer)
  get_property(libs GLOBAL PROPERTY Q19_CORE_LIBS)
  foreach(lib IN LISTS libs)
    get_target_property(deps ${lib} LINK_LIBRARIES)
    foreach(dep IN LISTS deps)
      if(dep MATCHES "Widgets|PrintSupport|Qt6::Gui|QCustomPlot|q19gui")
        message(FATAL_ERROR "core library ${lib} links ${dep}; the core layer must stay free of GUI modules")
      endif()
    endforeach()
  endforeach()
endfunction()
