/* The interface of VarnelKernel, the object kernel of a host application. C11 and C++20.
 *
 * Widths. Handles, tokens, counts, flags and results are unsigned 32-bit integers on every
 * platform; texts, bytes, callbacks, contexts and outs are pointers of the platform's size. Texts
 * are UTF-8 and end in NUL. Calls are cdecl.
 *
 * Handles. Each kind of handle is a type of its own in C++. 0 is the null handle. Objects, data,
 * lists and dictionaries are counted: who receives an owned handle releases it, once; who receives
 * a borrowed one may use it as long as its owner holds it, and retains it to keep it longer. Tokens
 * and registrations are not counted.
 *
 * Results. Every operation but VRKTokenGetString and VRKRuntimeError returns a result code, 0 for
 * success. An operation that fails stores nothing and changes nothing. Besides the codes that each
 * operation names, any of them may return
 *   kVRKInvalidHandle    a handle is null, stale, forged or of the wrong kind
 *   kVRKInvalidArgument  an out or another pointer that must not be null is null
 *   kVRKOutOfMemory
 *   kVRKNotRunning       there is no kernel to serve the call
 * and whatever code a callback returned that served it.
 *
 * Arguments named `reserved` are 0.
 */
#ifndef VARNEL_KERNEL_H
#define VARNEL_KERNEL_H

#include <stdint.h>

#if defined(_WIN32)
#define VRK_CALL __cdecl
#if defined(VARNEL_KERNEL_EXPORTS)
#define VRK_API __declspec(dllexport)
#else
#define VRK_API __declspec(dllimport)
#endif
#else
#define VRK_CALL
#define VRK_API __attribute__((visibility("default")))
#endif

typedef uint32_t VRKResult;

#define kVRKNoError UINT32_C(0)
#define kVRKInvalidHandle UINT32_C(1)
#define kVRKInvalidArgument UINT32_C(2)
#define kVRKNotFound UINT32_C(3)      /* no such entry, index or class */
#define kVRKAlreadyExists UINT32_C(4) /* the same registration is there already */
#define kVRKNotRunning UINT32_C(5)
#define kVRKInUse UINT32_C(6) /* what is to be ended is still needed */
#define kVRKNoResult \
  UINT32_C(14) /* a callback succeeded and left no result, or one that is no valid handle */
#define kVRKOutOfMemory UINT32_C(18)
#define kVRKCallbackThrew UINT32_C(20) /* an exception left a callback, which none may */
#define kVRKNotHandled UINT32_C(256)
#define kVRKCannotCoerce UINT32_C(512)

#ifdef __cplusplus
enum class VRKObject : uint32_t {};
enum class VRKMessageHandler : uint32_t {};
enum class VRKToken : uint32_t {};
enum class VRKData : uint32_t {};
enum class VRKList : uint32_t {};
enum class VRKDictionary : uint32_t {};
extern "C" {
#else
typedef uint32_t VRKObject;
typedef uint32_t VRKMessageHandler; /* a handler's registration on one object */
typedef uint32_t VRKToken;
typedef uint32_t VRKData;
typedef uint32_t VRKList;
typedef uint32_t VRKDictionary;
#endif

/* Callbacks. `context` is the pointer that was given with the callback; the pair of both pointers
 * identifies what was registered. Handles passed in are borrowed. No exception may leave a
 * callback.
 */

/* Makes an object of the class that was asked for and stores it, owned by the caller, in
 * *outObject. `parameters` may be null. */
typedef VRKResult(VRK_CALL* VRKObjectFactoryCallback)(VRKToken objectClass,
                                                      VRKDictionary parameters, void* context,
                                                      VRKObject* outObject);

/* Returns 0 when it has handled the message, kVRKNotHandled when others may try, or a failure code.
 * Results are stored in `parameters`, which may be null. */
typedef VRKResult(VRK_CALL* VRKMessageHandlerCallback)(VRKObject receiver, VRKToken message,
                                                       VRKDictionary parameters, void* context);

/* Stores the coerced data, owned by the caller, in *outData and returns 0, or returns
 * kVRKCannotCoerce or a failure code. */
typedef VRKResult(VRK_CALL* VRKDataCoercionCallback)(VRKData source, VRKToken fromType,
                                                     VRKToken toType, void* context,
                                                     VRKData* outData);

/* Objects */

/* Makes an object of a class through the factory that is registered for it, and stores it, owned by
 * the caller. The null class makes a plain object. `parameters` may be null. kVRKNotFound: no
 * factory serves the class. */
VRK_API VRKResult VRK_CALL VRKObjectCreate(VRKToken objectClass, VRKDictionary parameters,
                                           VRKObject* outObject);

/* Offers the message to the object's handlers that asked for it, until one returns another code
 * than kVRKNotHandled, which is then the result. `parameters` may be null; `flags` is 0 or 1. */
VRK_API VRKResult VRK_CALL VRKObjectDeliverMessage(VRKObject object, VRKToken message,
                                                   VRKDictionary parameters, uint32_t flags);

/* Null is accepted and does nothing. When an object's last reference is released, those of its
 * handlers that asked for "message:orvane.vrk.object-died" receive it, each exactly once. The
 * registrations of all its handlers end. */
VRK_API VRKResult VRK_CALL VRKObjectRetain(VRKObject object);
VRK_API VRKResult VRK_CALL VRKObjectRelease(VRKObject object);

/* The factory serves the class from now on; of several the one registered last does.
 * kVRKAlreadyExists: it serves the class already. */
VRK_API VRKResult VRK_CALL VRKObjectFactoryRegister(VRKToken objectClass, uint32_t reserved,
                                                    VRKObjectFactoryCallback callback,
                                                    void* context);

/* The factory serves no class any more. kVRKNotFound: it served none. */
VRK_API VRKResult VRK_CALL VRKObjectFactoryUnregister(uint32_t reserved,
                                                      VRKObjectFactoryCallback callback,
                                                      void* context);

/* Message handlers */

/* Attaches a handler to an object and stores the registration, which holds no reference to the
 * object. No message reaches the handler before it asks for some. */
VRK_API VRKResult VRK_CALL VRKMessageHandlerInstall(VRKObject object, uint32_t reserved1,
                                                    VRKMessageHandlerCallback callback,
                                                    void* context, uint32_t reserved2,
                                                    uint32_t reserved3,
                                                    VRKMessageHandler* outRegistration);

/* These messages reach the handler from now on, besides those it asked for before. After it has
 * received "message:orvane.vrk.object-died" the registration ends. `messages` may be null when
 * `count` is 0. */
VRK_API VRKResult VRK_CALL VRKMessageHandlerAddMessages(VRKMessageHandler registration,
                                                        const VRKToken* messages, uint32_t count);

/* Ends the registration, also while the handler is being called; `object` is the one it is on. */
VRK_API VRKResult VRK_CALL VRKMessageHandlerRemove(VRKMessageHandler registration,
                                                   VRKObject object);

/* Tokens */

/* Stores the token of a text: equal texts give equal tokens, and no two texts the same. A token is
 * never null. It lasts, with its text, until the process ends, also when the kernel is ended and
 * started again meanwhile: code that was loaded before keeps both. `flag` is 0, or 1 where the text
 * lasts as long as the library that passes it. */
VRK_API VRKResult VRK_CALL VRKTokenCreate(const char* text, uint32_t flag, VRKToken* outToken);

/* The token's text; null for what is no token. */
VRK_API const char* VRK_CALL VRKTokenGetString(VRKToken token);

/* Data: immutable bytes with a type */

/* Copies the bytes and stores the data, owned by the caller. `bytes` may be null when `byteCount`
 * is 0. The types "type:orvane.vrk.token", "…list" and "…dictionary" have a token or handle of four
 * bytes as their payload; data of a list or dictionary keeps a reference of its own to it. */
VRK_API VRKResult VRK_CALL VRKDataCreate(VRKToken type, const void* bytes, uint32_t byteCount,
                                         uint32_t reserved, VRKData* outData);

/* Each out may be null. *outBytes is readable while the data is held, and null when there are none.
 */
VRK_API VRKResult VRK_CALL VRKDataGetData(VRKData data, const void** outBytes,
                                          uint32_t* outByteCount, VRKToken* outType);

/* Stores the data as data of another type, owned by the caller; of its own type, the data itself or
 * a copy. Text that becomes "type:orvane.vrk.utf16" begins with a byte-order mark.
 * kVRKCannotCoerce: impossible. */
VRK_API VRKResult VRK_CALL VRKDataCoerce(VRKData data, VRKToken toType, VRKData* outData);

/* Null is accepted and does nothing. */
VRK_API VRKResult VRK_CALL VRKDataRetain(VRKData data);
VRK_API VRKResult VRK_CALL VRKDataRelease(VRKData data);

/* The handler coerces data of one type into another from now on; of several the one installed last
 * is asked first. kVRKAlreadyExists: it is installed for this pair. */
VRK_API VRKResult VRK_CALL VRKDataCoercionHandlerInstall(VRKToken fromType, VRKToken toType,
                                                         uint32_t reserved,
                                                         VRKDataCoercionCallback callback,
                                                         void* context);

/* Ends every installation of the handler. kVRKNotFound: there was none. */
VRK_API VRKResult VRK_CALL VRKDataCoercionHandlerRemove(VRKDataCoercionCallback callback,
                                                        void* context, uint32_t reserved1,
                                                        uint32_t reserved2);

/* Dictionaries: data by token */

/* Stores an empty dictionary, owned by the caller. */
VRK_API VRKResult VRK_CALL VRKDictionaryCreate(uint32_t reserved, VRKDictionary* outDictionary);

/* Stores the data under a key, borrowed: the dictionary owns it. kVRKNotFound: there is none. */
VRK_API VRKResult VRK_CALL VRKDictionaryGetEntry(VRKDictionary dictionary, VRKToken key,
                                                 VRKData* outData);

/* Puts data under a key, in place of what was there; the dictionary keeps a reference of its own.
 */
VRK_API VRKResult VRK_CALL VRKDictionarySetEntry(VRKDictionary dictionary, VRKToken key,
                                                 VRKData data);

/* Stores a list, owned by the caller, of one "type:orvane.vrk.token" datum for each key, in no
 * particular order. */
VRK_API VRKResult VRK_CALL VRKDictionaryCreateKeyList(VRKDictionary dictionary, VRKList* outList);

/* Null is accepted and does nothing. */
VRK_API VRKResult VRK_CALL VRKDictionaryRetain(VRKDictionary dictionary);
VRK_API VRKResult VRK_CALL VRKDictionaryRelease(VRKDictionary dictionary);

/* Lists: data by index */

VRK_API VRKResult VRK_CALL VRKListGetSize(VRKList list, uint32_t* outSize);

/* Stores the data at an index, from 0, borrowed: the list owns it. kVRKNotFound: the list is
 * shorter. */
VRK_API VRKResult VRK_CALL VRKListGetEntry(VRKList list, uint32_t index, VRKData* outData);

/* Null is accepted and does nothing. */
VRK_API VRKResult VRK_CALL VRKListRetain(VRKList list);
VRK_API VRKResult VRK_CALL VRKListRelease(VRKList list);

/* Memory */

/* Stores a block of that many bytes, aligned for any type. A block belongs to its caller, and may
 * be deallocated after the kernel has ended. */
VRK_API VRKResult VRK_CALL VRKMemoryAllocate(uint32_t byteCount, uint32_t reserved,
                                             void** outBlock);

/* Null is accepted and does nothing. */
VRK_API VRKResult VRK_CALL VRKMemoryDeallocate(void* block);

/* Reports */

/* Reports a check that failed. The result is true, in its low byte, when the caller is to break
 * into the debugger. *onceFlag, which may be set, tells the caller that this check need not be made
 * again. `severity` is 2 for a failed check; no text is null. */
VRK_API uint32_t VRK_CALL VRKRuntimeError(uint32_t severity, const char* domain,
                                          const char* expression, uint32_t reserved,
                                          const char* sourceFile, uint32_t line,
                                          const char* function, uint32_t* onceFlag);

#ifdef __cplusplus
} /* extern "C" */
#endif

#endif
