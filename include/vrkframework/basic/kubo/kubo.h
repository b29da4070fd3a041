// Umbrella header: every public declaration of kubo and of the framework interfaces it ships.
#ifndef VRKFRAMEWORK_BASIC_KUBO_KUBO_H
#define VRKFRAMEWORK_BASIC_KUBO_KUBO_H

#include "vrkframework/basic/kubo/kuboapi.h"
#include "vrkframework/basic/kubo/masks/bkgdrule.h"
#include "vrkframework/basic/kubo/masks/coordinatemaskbuilder.h"
#include "vrkframework/basic/kubo/masks/imaskbuilder.h"
#include "vrkframework/basic/kubo/masks/imaskdecision.h"
#include "vrkframework/basic/kubo/masks/imaskdecisionimpl.h"
#include "vrkframework/basic/kubo/masks/mask.h"
#include "vrkframework/basic/kubo/masks/maskdecision.h"
#include "vrkframework/basic/kubo/masks/maskdecisionbuilder.h"
#include "vrkframework/basic/kubo/raster/datatype.h"
#include "vrkframework/basic/kubo/raster/datatypeconstraints.h"
#include "vrkframework/basic/kubo/raster/nativedatatype.h"
#include "vrkframework/basic/kubo/raster/raster.h"
#include "vrkframework/basic/kubo/raster/rastercontext.h"
#include "vrkframework/basic/kubo/raster/rasterinfo.h"
#include "vrkframework/basic/kubo/raster/rasterwindow.h"
#include "vrkframework/basic/kubo/raster/tileiterator.h"
#include "vrkframework/platform/buffertype.h"
#include "vrkframework/platform/caseinsensitivecompare.h"
#include "vrkframework/platform/crs.h"
#include "vrkframework/platform/exception.h"
#include "vrkframework/platform/formatstring.h"
#include "vrkframework/platform/imptime.h"
#include "vrkframework/platform/interpretation.h"
#include "vrkframework/platform/platformapi.h"
#include "vrkframework/platform/rasterreader.h"

#endif  // VRKFRAMEWORK_BASIC_KUBO_KUBO_H
