// Every public header of libzv.
#ifndef ZV_ZV_H
#define ZV_ZV_H

#include <zv/api.h>
#include <zv/arrays.h>
#include <zv/bezier_fit.h>
#include <zv/bezier_tool.h>
#include <zv/critical_section.h>
#include <zv/fcurve.h>
#include <zv/fcurve_key_mover.h>
#include <zv/fcurve_stretcher.h>
#include <zv/fcurve_userdata.h>
#include <zv/fill.h>
#include <zv/gc.h>
#include <zv/matrix.h>
#include <zv/mip_path2f_prop1d.h>
#include <zv/morpher.h>
#include <zv/motion_path.h>
#include <zv/oval2f.h>
#include <zv/path2f.h>
#include <zv/path2f_prop1d.h>
#include <zv/path_builder.h>
#include <zv/path_prop_builder.h>
#include <zv/point.h>
#include <zv/polyline.h>
#include <zv/quat.h>
#include <zv/quat_fcurve.h>
#include <zv/raster.h>
#include <zv/raw_fcurve.h>
#include <zv/rect2f.h>
#include <zv/shape.h>
#include <zv/spline.h>
#include <zv/std_fcurve.h>
#include <zv/std_tgt_mover.h>
#include <zv/step_fcurve.h>
#include <zv/trace.h>
#include <zv/transfo4.h>
#include <zv/vectorizer.h>

#endif
