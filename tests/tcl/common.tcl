# Shared by the Tcl tests: loads the test kit and offers checks that every test file uses.
package require TcltaskI_TestKit
namespace import ::tcltest::*
