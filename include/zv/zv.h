// Every public header of libzv.
#ifndef ZV_ZV_H
#define ZV_ZV_H

#include <zv/api.h>
#include <zv/arrays.h>
#include <zv/bezier_tool.h>
#include <zv/critical_section.h>
#include <zv/point.h>
#include <zv/trace.h>

#endif
