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
template <typename T>
class KpDMatrix;
template <typename T, T empty>
class KpID;
template <typename T>
class KpID_C;

class KpAllocator;
class KpException;
class KpMemoryException;
class KpPrimType;
class KpString;
class KpStringTokenizer;
class KpStringTokenizerGeneral;
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

struct Kp128;
class KpFrameID;
class KpRemotificationID;
class KpTransferID;
class KpUniqueID;
class TmSessionContextID;

class KpLogFile;
class KpMessageCollector;
class KpResult;

class HxParamBase;
class HxParamBundle;
class HxParamEditCheck;
class HxParameter;

class KpAbstractCoordinateSystem;
class KpBox2f;
class KpBox3f;
class KpBox3i;
class KpCoordinateSystem;
class KpFrameOfReference;
class KpOrientationLetters;
class KpProjector;
class KpSphereProjector;
class KpSphereSheetProjector;
class KpViewVolume;
class KpCutBoxPlane;
class KpCutBoxPlaneDouble;
class KpLine;
class KpMat3f;
class KpMat4f;
class KpPlane;
class KpRotation;
class KpSphere;
class KpVec2f;
class KpVec2i;
class KpVec3d;
class KpVec3f;
class KpVec3i;
class KpVec3l;
class KpVec4f;
class KpVec4i;

class KpFitPlane;
class KpODE2;
class KpODE3;

class KpColor;
class KpPackedIndexing;
class KpRawData;
class KpRawData2D;
class KpRawData3D;
class KpSuperPackedIndexing;
class KpTypedData2D;
class KpTypedData3D;
class KpTypedElement;
struct KpTypedPointer;
class TmDataAccess;
class TmSSETools;

class KpBitfield;
class KpConnectedComponents;
class KpMorphology;
class KpNeighborIterator33;
class KpScanConvert;

class AbstractEllipse2D;
class AbstractShape2D;
class Angle2D;
class Circle2D;
class CurvedShape2D;
class Ellipse2D;
class KpLine2D;
class Polygon2D;
class Polyline2D;
class Rectangle2D;
class Shape2D;

class KpHttpGet;
class KpSocket;
class KpSocketTools;
class TmMsg;

class KpDelaunay;
class KpPls;
class KpRandom;
class KpSimAnnState;
class KpSimulatedAnnealer;
class KpStatistics;

class KpCallable;
class KpProgressGuiInterface;
class KpProgressInterface;
class KpThread;
class KpWorkerThread;
class ProgressScope;

class KpScopedWatch;
class KpWatch;

class KpBuildInfo;
class KpCPUInfo;
class KpCoder;
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
class KpUUID;
class KpVersion;

namespace KpLib {
class MD5;
class MD5Coder;
class MD5List;
}  // namespace KpLib
