#pragma once

// All of the library, for a quick start; headers of their own keep a build faster.

#include <kplib/foundation/KpAllocator.h>
#include <kplib/foundation/KpDArray.h>
#include <kplib/foundation/KpException.h>
#include <kplib/foundation/KpExport.h>
#include <kplib/foundation/KpForward.h>
#include <kplib/foundation/KpMemory.h>
#include <kplib/foundation/KpMemoryException.h>
#include <kplib/foundation/KpPrimType.h>
#include <kplib/foundation/KpStdStringTokenizer.h>
#include <kplib/foundation/KpString.h>
#include <kplib/foundation/KpStringTokenizer.h>
#include <kplib/foundation/StringUtils.h>
#include <kplib/imaging/KpColor.h>
#include <kplib/param/HxParamBase.h>
#include <kplib/param/HxParamBundle.h>
#include <kplib/param/HxParamEditCheck.h>
#include <kplib/param/HxParameter.h>
