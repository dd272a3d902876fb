#include "sink.h"

Sink::Sink() : taken_(0), last_('\0') {}

Sink::~Sink() = default;

void Sink::Take(const char* word) {
    ++taken_;
    last_ = word[0];
}

unsigned long Sink::Taken() const { return taken_; }
