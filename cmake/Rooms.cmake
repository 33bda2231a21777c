# A room is a folder of src/ and also one build target. The compiler of a room finds only the headers of this room, of
# the rooms that it uses, and of the rooms that those use. An include of any other room does not compile.
#
#   kest_room(inbound USES reports messages)         an object library with the sources in src/inbound
#   kest_room(setup STATIC USES base ...)            a static library, for rooms that are not part of the component
#   kest_room(pdf MODULE USES base print ...)        a library that the component loads when it needs it
#   kest_room(platform NAME values LINKS Qt6::Core)  a target name of its own, and libraries to link
#
# The target of src/platform/xml is kest_xml. To limit the headers, the build tree has a folder of links for each room,
# and no target has the whole of src/ on its include path.
function(kest_room folder)
    cmake_parse_arguments(room "STATIC;MODULE" "NAME" "USES;LINKS" ${ARGN})
    if(NOT room_NAME)
        get_filename_component(room_NAME ${folder} NAME)
    endif()
    set(target kest_${room_NAME})
    file(GLOB sources CONFIGURE_DEPENDS ${CMAKE_CURRENT_SOURCE_DIR}/*.cpp ${CMAKE_CURRENT_SOURCE_DIR}/*.h)
    list(FILTER sources EXCLUDE REGEX "/main\\.cpp$")
    if(room_STATIC)
        add_library(${target} STATIC ${sources})
        target_link_libraries(${target} PUBLIC kest2lib)
    elseif(room_MODULE)
        add_library(${target} MODULE ${sources})
        set_target_properties(${target} PROPERTIES DEFINE_SYMBOL "")  # all rooms share the precompiled headers
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

# Links the headers of a room into the build tree.
function(kest_link_headers name folder)
    set(links ${PROJECT_BINARY_DIR}/rooms/${name}/${folder})
    file(GLOB headers CONFIGURE_DEPENDS ${CMAKE_CURRENT_SOURCE_DIR}/*.h)
    file(MAKE_DIRECTORY ${links})
    foreach(header ${headers})
        get_filename_component(file ${header} NAME)
        file(CREATE_LINK ${header} ${links}/${file} SYMBOLIC)
    endforeach()
endfunction()

# All rooms share two precompiled headers: one for rooms without windows and one for rooms with windows.
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
