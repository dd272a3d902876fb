// The generated binding of the baseline object: the class as it is, nothing added.
%module benchsink
%{
#include "sink.h"
%}
%include "sink.h"
