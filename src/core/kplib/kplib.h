#pragma once

// All of the library, for a quick start; headers of their own keep a build faster.

#include <kplib/foundation/KpAllocator.h>
#include <kplib/foundation/KpDArray.h>
#include <kplib/foundation/KpEditable.h>
#include <kplib/foundation/KpException.h>
#include <kplib/foundation/KpExport.h>
#include <kplib/foundation/KpForward.h>
#include <kplib/foundation/KpHandable.h>
#include <kplib/foundation/KpHandableThreaded.h>
#include <kplib/foundation/KpHandle.h>
#include <kplib/foundation/KpInterface.h>
#include <kplib/foundation/KpInterfaceOwner.h>
#include <kplib/foundation/KpInterfaceOwnerDefaultImpl.h>
#include <kplib/foundation/KpMemory.h>
#include <kplib/foundation/KpMemoryException.h>
#include <kplib/foundation/KpMutex.h>
#include <kplib/foundation/KpPrimType.h>
#include <kplib/foundation/KpStdStringTokenizer.h>
#include <kplib/foundation/KpString.h>
#include <kplib/foundation/KpStringTokenizer.h>
#include <kplib/foundation/KpThreadLocalStorage.h>
#include <kplib/foundation/KpTypeInfo.h>
#include <kplib/foundation/KpTypedObject.h>
#include <kplib/foundation/KpWaitCondition.h>
#include <kplib/foundation/StringUtils.h>
#include <kplib/log/KpLastError.h>
#include <kplib/log/KpLogFile.h>
#include <kplib/log/KpLogLevel.h>
#include <kplib/log/KpResult.h>
#include <kplib/threads/KpProgressGuiInterface.h>
#include <kplib/threads/KpProgressInterface.h>
#include <kplib/threads/ProgressScope.h>
