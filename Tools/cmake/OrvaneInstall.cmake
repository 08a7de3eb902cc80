# Where things are installed, as seen from each other, so that the tree works under any prefix, and
# wherever it is moved to as a whole.

# orvane_relative(VARIABLE FROM TO): the way between two folders of the installed tree, which are
# named as by GNUInstallDirs: "LIBDIR", "DATADIR".
function(orvane_relative variable from to)
    file(RELATIVE_PATH way ${CMAKE_INSTALL_FULL_${from}} ${CMAKE_INSTALL_FULL_${to}})
    set(${variable} ${way} PARENT_SCOPE)
endfunction()

# From the library to what it needs at run time.
orvane_relative(ORVANE_DATA_FROM_LIBRARY LIBDIR DATADIR)
orvane_relative(ORVANE_LIBEXEC_FROM_LIBRARY LIBDIR LIBEXECDIR)

# orvane_finds_library(TARGET FOLDER): an installed program of FOLDER, a full path, finds the library
# of its own tree. Packages for the system's folders switch that off with CMAKE_SKIP_INSTALL_RPATH.
function(orvane_finds_library target folder)
    file(RELATIVE_PATH way ${folder} ${CMAKE_INSTALL_FULL_LIBDIR})
    set_target_properties(${target} PROPERTIES INSTALL_RPATH "$ORIGIN/${way}")
endfunction()
