// ZvStdFCurve: flattening for display and sampling, through the shared assembly of a keyed
// curve's polyline.
#include <zv/std_fcurve.h>

#include "fcurve/cfc_flatten.h"
#include "fcurve/fcurve_lock.h"
#include "fcurve/std_fcurve_impl.h"

ZV_CFC_DRAWING_SLOTS(ZvStdFCurve)
