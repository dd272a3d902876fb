// A plain Tcl shell, built with the same instrumentation as the libraries it loads in tests.
#include <tcl.h>

static int AppInit(Tcl_Interp* interp) { return Tcl_Init(interp); }

int main(int argc, char** argv) {
    Tcl_Main(argc, argv, AppInit);
    return 0;
}
