# One object library per family of the library. A family names the Qt modules it needs and
# nothing more, so a Qt Core family cannot include a Qt Gui or Qt Widgets header by accident.
# Its public headers are listed one by one: making a header public is a decision. They are
# reached in the build tree through forwarding headers under ${ZUBASE_INCLUDE_DIR}/zubase/ and
# installed flat, so hosts write #include <zubase/X.h> whatever the family folder.
#
# A family whose lists are still empty adds nothing.
#
# zubase_add_family(<family>
#     QT <Qt modules, e.g. Core Xml>
#     PUBLIC_HEADERS <headers installed as <zubase/X.h>>
#     SOURCES <sources, internal headers, resources>
#     [LIBS <further private libraries>])
function(zubase_add_family family)
    cmake_parse_arguments(F "" "" "QT;PUBLIC_HEADERS;SOURCES;LIBS" ${ARGN})
    if(NOT F_PUBLIC_HEADERS AND NOT F_SOURCES)
        return() # a family folder waiting for its first class
    endif()
    set(target zubase_${family})
    add_library(${target} OBJECT ${F_PUBLIC_HEADERS} ${F_SOURCES})
    # Every family builds part of libzubase: the export macro must mark its API for export.
    set_target_properties(${target} PROPERTIES DEFINE_SYMBOL zubase_EXPORTS)
    target_include_directories(${target} PUBLIC
        $<BUILD_INTERFACE:${ZUBASE_INCLUDE_DIR}>
        $<BUILD_INTERFACE:${PROJECT_SOURCE_DIR}/src/core>)
    list(TRANSFORM F_QT PREPEND Qt5::)
    target_link_libraries(${target} PUBLIC rklib ${F_QT} PRIVATE ${F_LIBS})

    foreach(header IN LISTS F_PUBLIC_HEADERS)
        get_filename_component(name ${header} NAME)
        get_filename_component(path ${header} ABSOLUTE)
        get_property(known GLOBAL PROPERTY ZUBASE_PUBLIC_HEADER_NAMES)
        if(name IN_LIST known)
            message(FATAL_ERROR "zubase: two public headers are called ${name}")
        endif()
        set_property(GLOBAL APPEND PROPERTY ZUBASE_PUBLIC_HEADER_NAMES ${name})
        set_property(GLOBAL APPEND PROPERTY ZUBASE_PUBLIC_HEADERS ${path})
        file(CONFIGURE OUTPUT ${ZUBASE_INCLUDE_DIR}/zubase/${name}
            CONTENT "// Forwarding header of the build tree; installed hosts get the file itself.\n#include \"${path}\"\n")
    endforeach()
    set_property(GLOBAL APPEND PROPERTY ZUBASE_FAMILIES ${target})
endfunction()
