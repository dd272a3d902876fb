# The libraries that run inside a Tcl interpreter reach Tcl through the stub table of the
# interpreter that loads them, not by linking libtcl8.6.so: so they load into any program with Tcl
# 8.6 in it, one with its own build of Tcl linked in as well. Each such library keeps its own
# pointer to the table (the stub library's variables are hidden) and sets it with Tcl_InitStubs in
# its entry before it calls Tcl. Programs that create interpreters (kelmarsh, the tests) link
# libtcl8.6.so as usual.
find_package(TclStub)
if(NOT TCL_STUB_LIBRARY)
  message(FATAL_ERROR "the Tcl stub library (libtclstub8.6.a, in tcl8.6-dev) was not found")
endif()

function(kelmar_use_tcl_stubs target)
  target_compile_definitions(${target} PRIVATE USE_TCL_STUBS)
  target_link_libraries(${target} PRIVATE ${TCL_STUB_LIBRARY})
endfunction()
