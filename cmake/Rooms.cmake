# A room is one folder of src/, one build target and one set of headers.
#
#   kest_room(inbound reports messages)          objects in src/inbound, may include reports, messages and what is below
#   kest_room(platform/xml values STATIC ...)    a static library instead, for what is not in the component
#
# The target of the folder platform/xml is kest_xml. Its compiler sees the headers of its own folder, of the rooms
# named, and of what those are built on; an include of any other room does not compile. For that the build tree holds a
# folder of links for each room, and no target has all of src/ on its include path.
function(kest_room folder)
    cmake_parse_arguments(room "STATIC" "NAME" "USES;LINKS" ${ARGN})
    if(NOT room_NAME)
        get_filename_component(room_NAME ${folder} NAME)
    endif()
    set(target kest_${room_NAME})
    file(GLOB sources CONFIGURE_DEPENDS ${CMAKE_CURRENT_SOURCE_DIR}/*.cpp ${CMAKE_CURRENT_SOURCE_DIR}/*.h)
    list(FILTER sources EXCLUDE REGEX "/main\\.cpp$")
    if(room_STATIC)
        add_library(${target} STATIC ${sources})
        target_link_libraries(${target} PUBLIC kest2lib)
    else()
        add_library(${target} OBJECT ${sources})
        set_property(GLOBAL APPEND PROPERTY KEST_COMPONENT_ROOMS ${target})
    endif()
    target_link_libraries(${target} PUBLIC kest_options ${room_LINKS})

    set(reach ${room_NAME})
    foreach(used ${room_USES})
        get_target_property(below kest_${used} KEST_REACH)
        list(APPEND reach ${below})
    endforeach()
    list(REMOVE_DUPLICATES reach)
    set_target_properties(${target} PROPERTIES KEST_REACH "${reach}")
    foreach(reached ${reach})
        target_include_directories(${target} PUBLIC ${PROJECT_BINARY_DIR}/rooms/${reached})
        if(NOT reached STREQUAL room_NAME)
            get_target_property(links kest_${reached} KEST_LINKS)
            if(links)
                target_link_libraries(${target} PUBLIC ${links})
            endif()
        endif()
    endforeach()
    set_target_properties(${target} PROPERTIES KEST_LINKS "${room_LINKS}")

    kest_link_headers(${room_NAME} ${folder})
    kest_precompile(${target})
endfunction()

# A folder with subfolders that are rooms of their own gets a link for each header; any other gets one link.
function(kest_link_headers name folder)
    set(links ${PROJECT_BINARY_DIR}/rooms/${name}/${folder})
    file(GLOB headers CONFIGURE_DEPENDS ${CMAKE_CURRENT_SOURCE_DIR}/*.h)
    file(MAKE_DIRECTORY ${links})
    foreach(header ${headers})
        get_filename_component(file ${header} NAME)
        file(CREATE_LINK ${header} ${links}/${file} SYMBOLIC)
    endforeach()
endfunction()

# Two precompiled headers serve all rooms: one for those without windows, one for those with.
function(kest_precompile target)
    if(NOT KEST_PCH)
        return()
    endif()
    get_target_property(links ${target} LINK_LIBRARIES)
    if(links MATCHES "Qt6::Widgets")
        target_precompile_headers(${target} REUSE_FROM kest_windows_headers)
    else()
        target_precompile_headers(${target} REUSE_FROM kest_core_headers)
    endif()
endfunction()
