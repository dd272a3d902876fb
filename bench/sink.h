// The object behind the baselines: one virtual operation taking a word, as small as a wrapped
// interface can be. The native command and the generated binding both call it.
#ifndef KELMAR_BENCH_SINK_H
#define KELMAR_BENCH_SINK_H

class Sink {
public:
    Sink();
    virtual ~Sink();
    // Keeps a trace of the word so that no compiler may drop the call.
    virtual void Take(const char* word);
    unsigned long Taken() const;

private:
    unsigned long taken_;
    char last_;
};

#endif
