// Every public header of libzv.
#ifndef ZV_ZV_H
#define ZV_ZV_H

#include <zv/api.h>
#include <zv/arrays.h>
#include <zv/bezier_fit.h>
#include <zv/bezier_tool.h>
#include <zv/critical_section.h>
#include <zv/fcurve.h>
#include <zv/fcurve_userdata.h>
#include <zv/fill.h>
#include <zv/gc.h>
#include <zv/matrix.h>
#include <zv/path2f.h>
#include <zv/point.h>
#include <zv/polyline.h>
#include <zv/raster.h>
#include <zv/raw_fcurve.h>
#include <zv/shape.h>
#include <zv/spline.h>
#include <zv/std_fcurve.h>
#include <zv/step_fcurve.h>
#include <zv/trace.h>
#include <zv/transfo4.h>

#endif
