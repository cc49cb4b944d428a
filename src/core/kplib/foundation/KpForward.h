#pragma once

// Declarations of the classes that headers mostly point to; for their definitions include the header of that name.

template <typename T>
class KpDArray;
template <typename T>
class KpHandle;
template <typename T>
class KpThreadLocalStorage;
template <typename Lock>
class KpScopedLockT;

class KpAllocator;
class KpException;
class KpMemoryException;
class KpPrimType;
class KpString;
class KpStringTokenizer;
class KpStdStringTokenizer;

class KpMutex;
class KpWaitCondition;

class KpHandable;
class KpHandableThreaded;
class KpTypeInfo;
class KpTypedObject;
class KpInterface;
class KpInterfaceOwner;
class KpInterfaceOwnerDefaultImpl;
class KpEditable;
class KpEditingListener;

class KpLogFile;
class KpMessageCollector;
class KpResult;

class HxParamBase;
class HxParamBundle;
class HxParamEditCheck;
class HxParameter;

class KpAbstractCoordinateSystem;
class KpCoordinateSystem;
class KpFrameOfReference;
class KpProjector;
class KpSphereProjector;
class KpSphereSheetProjector;
class KpViewVolume;
class KpOrientationLetters;

class KpCutBoxPlane;
class KpCutBoxPlaneDouble;
class KpLine;
class KpPlane;
class KpSphere;

class KpColor;
class KpRawData;
class KpTypedElement;
struct KpTypedPointer;

class KpProgressGuiInterface;
class KpProgressInterface;
class ProgressScope;

class KpScopedWatch;
class KpWatch;

class KpBuildInfo;
class KpCPUInfo;
class KpDataBase;
class KpDirectory;
class KpDSO;
class KpFilename;
class KpFilenameCollector;
class KpOSInfo;
class KpProcessInfo;
class KpSysInfo;
class KpTable;
class KpTmpDir;
class KpVersion;
