// `zv curve`: a function curve from keys or a saved block, sampled to CSV, plotted to PNG, saved
// as a block.
#ifndef ZV_TOOLS_CURVE_H
#define ZV_TOOLS_CURVE_H

// The lines `zv help` prints for the command.
extern const char kZvCurveUsage[];

// Runs `zv curve` on argv[2..]. Failures print one line on standard error; the result is the exit
// status: 0, 1 for bad input or output, 2 for a bad command line.
int ZvCurveCommand(int argc, char** argv);

#endif
