// A plain Tcl shell for the tests: ktclsh, built with the same instrumentation as the libraries it
// loads; statictclsh, with Tcl's static library linked in.
#include <tcl.h>

static int AppInit(Tcl_Interp* interp) { return Tcl_Init(interp); }

int main(int argc, char** argv) {
    Tcl_Main(argc, argv, AppInit);
    return 0;
}
