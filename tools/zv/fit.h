// zv fit: pen points through one of the library's path builders, out as SVG path data.
#ifndef ZV_TOOLS_FIT_H
#define ZV_TOOLS_FIT_H

// The command: argv[2] on are its options. Exit code 0, 1 for bad input or output, 2 for a bad
// command line; every failure is one line on standard error.
int ZvFitCommand(int argc, char** argv);

#endif
