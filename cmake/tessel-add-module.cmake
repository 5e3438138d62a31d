# tessel_add_module(NAME SOURCE...): a module of the host, NAME.tsx, which exports tsxFunction and
# nothing else and leaves the host's functions to the host.
function(tessel_add_module name)
    add_library(${name} MODULE ${ARGN})
    target_link_libraries(${name} PRIVATE tessel::host)
    set_target_properties(${name} PROPERTIES
        PREFIX "" SUFFIX .tsx
        C_VISIBILITY_PRESET hidden
        CXX_VISIBILITY_PRESET hidden
        VISIBILITY_INLINES_HIDDEN ON)
endfunction()
