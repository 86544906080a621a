/* The host's side of the embedded kernel: what a host needs beyond VarnelKernel.h. C11 and C++20.
 *
 * A process has one kernel. It serves one call at a time: calls from several threads wait for each
 * other, and a call that is made from within a callback is served at once. Everything that
 * VarnelKernel.h says of widths, handles, results and arguments holds here too.
 */
#ifndef VARNEL_KERNEL_HOST_H
#define VARNEL_KERNEL_HOST_H

#include "VarnelKernel.h"

#ifdef __cplusplus
enum class VRKPlugIn : uint32_t {};
extern "C" {
#else
typedef uint32_t VRKPlugIn;
#endif

/* How many handles, registrations and blocks there are of each kind. */
typedef struct VRKHostLiveCounts {
  uint32_t objects;
  uint32_t messageHandlers;
  uint32_t objectFactories; /* counted once for each class they serve */
  uint32_t dataCoercions;   /* counted once for each pair of types */
  uint32_t data;
  uint32_t lists;
  uint32_t dictionaries;
  uint32_t memoryBlocks;
  uint32_t plugIns;
} VRKHostLiveCounts;

/* kVRKAlreadyExists: the kernel is running. */
VRK_API VRKResult VRK_CALL VRKHostStart(void);

/* Ends the kernel. *outLive, which may be null, gets what was still alive. All of it ends without a
 * word to anybody, and its handles are stale from then on; only tokens, memory blocks and loaded
 * libraries stay, so that code which still holds their addresses may do so. kVRKInUse, and nothing
 * is ended: the call comes from within a callback. */
VRK_API VRKResult VRK_CALL VRKHostShutDown(VRKHostLiveCounts* outLive);

VRK_API VRKResult VRK_CALL VRKHostGetLiveCounts(VRKHostLiveCounts* outLive);

/* Plug-ins */

/* Loads a library whose entry points are called `prefix` followed by Initialize, Terminate and
 * Version. A path without a separator is searched for where the system looks for libraries,
 * including the folder of the kernel's own. The library may call the kernel from its constructors,
 * also while other threads load, initialise, terminate or unload plug-ins.
 *
 * kVRKNotFound: there is no such library, or it lacks an entry point; VRKHostLoadError says why. A
 * library that lacks one is unloaded again, unless it has installed callbacks or its code is
 * running.
 *
 * Not to be called from within a callback, which holds the kernel's lock: where another thread
 * loads or unloads a library that calls the kernel meanwhile, each would wait for the other. */
VRK_API VRKResult VRK_CALL VRKHostPlugInLoad(const char* path, const char* prefix,
                                             VRKPlugIn* outPlugIn);

/* Why the calling thread's latest VRKHostPlugInLoad returned kVRKNotFound, else empty; valid until
 * its next one. */
VRK_API const char* VRK_CALL VRKHostLoadError(void);

/* Call the entry points and return what they return. Objects that are created while a plug-in
 * initialises are kept alive until its VRKHostPlugInTerminate returns, but for those of a creation
 * that fails. kVRKInUse, and nothing is initialised or terminated: code of the plug-in is running.
 */
VRK_API VRKResult VRK_CALL VRKHostPlugInInitialize(VRKPlugIn plugIn);
VRK_API VRKResult VRK_CALL VRKHostPlugInTerminate(VRKPlugIn plugIn);
VRK_API VRKResult VRK_CALL VRKHostPlugInVersion(VRKPlugIn plugIn, uint32_t* outVersion);

/* Unloads the library, whether it was terminated or not. Objects that were kept for it are released
 * first. kVRKInUse, and nothing is unloaded: one of its callbacks is still installed (the trace
 * hook and the reporter count), or its code is running. Code in other libraries that it loaded is
 * not searched for. Not to be called from within a callback, as VRKHostPlugInLoad. */
VRK_API VRKResult VRK_CALL VRKHostPlugInUnload(VRKPlugIn plugIn);

/* Lists and data of handles. Outs are owned by the caller. */

VRK_API VRKResult VRK_CALL VRKHostListCreate(VRKList* outList);

/* The list keeps a reference of its own. */
VRK_API VRKResult VRK_CALL VRKHostListAppend(VRKList list, VRKData data);

/* Data of the types "type:orvane.vrk.token", "type:orvane.vrk.list" and
 * "type:orvane.vrk.dictionary". */
VRK_API VRKResult VRK_CALL VRKHostTokenDataCreate(VRKToken token, VRKData* outData);
VRK_API VRKResult VRK_CALL VRKHostListDataCreate(VRKList list, VRKData* outData);
VRK_API VRKResult VRK_CALL VRKHostDictionaryDataCreate(VRKDictionary dictionary, VRKData* outData);

/* Trace */

enum {
  kVRKTraceNumber,  /* in `number` */
  kVRKTraceText,    /* in `pointer` */
  kVRKTracePointer, /* in `pointer`; bytes, callbacks, contexts */
  kVRKTraceObject,  /* handles and tokens, in `number` */
  kVRKTraceHandler,
  kVRKTraceToken,
  kVRKTraceData,
  kVRKTraceList,
  kVRKTraceDictionary
};

typedef struct VRKHostTraceArgument {
  uint32_t kind;
  uint32_t isOut; /* the value is what was stored there, or 0 as long as nothing was */
  uint32_t number;
  const void* pointer;
} VRKHostTraceArgument;

typedef struct VRKHostTraceCall {
  const char* operation; /* its name in VarnelKernel.h */
  const VRKHostTraceArgument* arguments;
  uint32_t argumentCount;
  uint32_t depth;      /* how many calls it is nested in */
  uint32_t isFinished; /* 0 before the call runs, 1 after it; `result` is set then */
  VRKResult result;
} VRKHostTraceCall;

/* Called before and after each operation of VarnelKernel.h except VRKTokenGetString, which is not
 * traced. A result other than 0 before the operation runs becomes the operation's result, and the
 * operation does not run. The result after it is ignored. VRKRuntimeError has no result code: its
 * result in the trace is 0, and it returns 0 if it did not run. Calls that the hook makes itself
 * are not traced. No exception may leave the hook. */
typedef VRKResult(VRK_CALL* VRKHostTraceHook)(const VRKHostTraceCall* call, void* context);

/* Installs the one trace hook; null for none. */
VRK_API VRKResult VRK_CALL VRKHostSetTraceHook(VRKHostTraceHook hook, void* context);

/* Error reports */

/* Serves VRKRuntimeError, and returns what it returns. */
typedef uint32_t(VRK_CALL* VRKHostErrorReporter)(uint32_t severity, const char* domain,
                                                 const char* expression, const char* sourceFile,
                                                 uint32_t line, const char* function,
                                                 uint32_t* onceFlag, void* context);

/* Installs the reporter. Null for the kernel's own, which prints a report on standard error, sets
 * its once-flag and returns 0. */
VRK_API VRKResult VRK_CALL VRKHostSetErrorReporter(VRKHostErrorReporter reporter, void* context);

#ifdef __cplusplus
} /* extern "C" */
#endif

#endif
