/* The host interface of the embedded kernel: what a host needs beyond VarnelKernel.h. C11 and
 * C++20.
 *
 * A process has one kernel. One recursive lock serialises all calls, so any thread may call, and a
 * callback may call while its thread holds the lock. The conventions of VarnelKernel.h for widths,
 * handles, results and arguments hold here too.
 */
#ifndef VARNEL_KERNEL_HOST_H
#define VARNEL_KERNEL_HOST_H

#include "wrapper-framework/source/VarnelKernel.h"

#ifdef __cplusplus
enum class VRKPlugIn : uint32_t {};
extern "C" {
#else
typedef uint32_t VRKPlugIn;
#endif

/* The number of live handles, registrations and blocks of each kind. */
typedef struct VRKHostLiveCounts {
  uint32_t objects;
  uint32_t messageHandlers;
  uint32_t objectFactories; /* one for each class of each factory */
  uint32_t dataCoercions;   /* one for each pair of types of each handler */
  uint32_t data;
  uint32_t lists;
  uint32_t dictionaries;
  uint32_t memoryBlocks;
  uint32_t plugIns;
} VRKHostLiveCounts;

/* kVRKAlreadyExists: the kernel is running. */
VRK_API VRKResult VRK_CALL VRKHostStart(void);

/* Shuts the kernel down. *outLive, which may be null, receives the counts of what was still alive.
 * Everything is destroyed without object-died messages, and all handles become stale. Tokens,
 * memory blocks and loaded libraries stay, because other code may still hold their addresses.
 * kVRKInUse: the call comes from within a callback; nothing happened. */
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
 * Do not call this from a callback unless no other thread can be loading or unloading a library
 * meanwhile. A callback runs under the kernel's lock, and loading takes the system's loader lock; a
 * library that calls the kernel as it is loaded takes them in the opposite order. */
VRK_API VRKResult VRK_CALL VRKHostPlugInLoad(const char* path, const char* prefix,
                                             VRKPlugIn* outPlugIn);

/* The reason for which the calling thread's latest VRKHostPlugInLoad returned kVRKNotFound, else an
 * empty text; cut after 4,095 bytes. Valid until the thread's next VRKHostPlugInLoad. */
VRK_API const char* VRK_CALL VRKHostLoadError(void);

/* Call the entry points and return their results. While Initialize runs, the kernel retains each
 * object that is created successfully; it releases these objects after VRKHostPlugInTerminate or
 * before VRKHostPlugInUnload, also if Initialize failed. kVRKInUse: code of the plug-in is running;
 * nothing happened. */
VRK_API VRKResult VRK_CALL VRKHostPlugInInitialize(VRKPlugIn plugIn);
VRK_API VRKResult VRK_CALL VRKHostPlugInTerminate(VRKPlugIn plugIn);
VRK_API VRKResult VRK_CALL VRKHostPlugInVersion(VRKPlugIn plugIn, uint32_t* outVersion);

/* Unloads the library, whether it was terminated or not. Objects that the kernel retains for it are
 * released first. kVRKInUse: one of its callbacks is still installed, including the trace hook and
 * the reporter, or its code is running; the library stays. Code in other libraries that it loaded
 * is not considered. For calls from a
 * callback, see VRKHostPlugInLoad. */
VRK_API VRKResult VRK_CALL VRKHostPlugInUnload(VRKPlugIn plugIn);

/* Lists, and data that holds a handle (as VRKDataCreate with the handle as payload). Outs are owned
 * by the caller. */

VRK_API VRKResult VRK_CALL VRKHostListCreate(VRKList* outList);

/* The list retains the data. */
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
  uint32_t isOut; /* the value is what was stored, or 0 if nothing was stored */
  uint32_t number;
  const void* pointer;
} VRKHostTraceArgument;

typedef struct VRKHostTraceCall {
  const char* operation; /* its name in VarnelKernel.h */
  const VRKHostTraceArgument* arguments;
  uint32_t argumentCount;
  uint32_t depth;      /* the number of calls that it is nested in */
  uint32_t isFinished; /* 0 before the call runs, 1 after it, when `result` is set */
  VRKResult result;
} VRKHostTraceCall;

/* Called before and after each operation of VarnelKernel.h except VRKTokenGetString, which is not
 * traced: on the calling thread, under the kernel's lock. A result other than 0 before the
 * operation runs becomes the operation's result, and the operation does not run. The result after
 * it is ignored. VRKRuntimeError has no result code: its result in the trace is 0, and it returns 0
 * if it did not run. `call` and its pointers are valid during the call only. Calls that the hook
 * makes itself are not traced. No exception may leave the hook. */
typedef VRKResult(VRK_CALL* VRKHostTraceHook)(const VRKHostTraceCall* call, void* context);

/* Replaces the trace hook. Null removes it. */
VRK_API VRKResult VRK_CALL VRKHostSetTraceHook(VRKHostTraceHook hook, void* context);

/* Error reports */

/* Called by VRKRuntimeError, which returns its result: on the calling thread, under the kernel's
 * lock. `domain` names the component that reports. Texts are valid during the call only. No
 * exception may leave the reporter. */
typedef uint32_t(VRK_CALL* VRKHostErrorReporter)(uint32_t severity, const char* domain,
                                                 const char* expression, const char* sourceFile,
                                                 uint32_t line, const char* function,
                                                 uint32_t* onceFlag, void* context);

/* Replaces the reporter. Null restores the kernel's own, which prints the report on standard error,
 * sets the once-flag and returns 0. */
VRK_API VRKResult VRK_CALL VRKHostSetErrorReporter(VRKHostErrorReporter reporter, void* context);

#ifdef __cplusplus
} /* extern "C" */
#endif

#endif
