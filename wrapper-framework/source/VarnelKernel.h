/* The C interface of VarnelKernel, the object kernel of a host application. C11 and C++20.
 *
 * Widths. Handles, tokens, counts, flags and results are unsigned 32-bit integers on every
 * platform. Texts, bytes, callbacks, contexts and outs are pointers of the platform's size. Texts
 * are UTF-8 and end in NUL. Calls are cdecl.
 *
 * Handles. Each kind of handle is a type of its own in C++. 0 is the null handle. Objects, data,
 * lists and dictionaries are reference-counted. The receiver of an owned handle releases it once.
 * The receiver of a borrowed handle may use it while its owner holds it, and retains it to keep it
 * longer. Tokens and registrations are not reference-counted.
 *
 * Results. Every operation except VRKTokenGetString and VRKRuntimeError returns a result code, 0
 * for success. An operation that fails stores nothing and changes nothing. Each operation documents
 * its own codes. Any operation may also return the code of a callback that it called, and
 *   kVRKInvalidHandle    a handle is null, stale, forged or of the wrong kind
 *   kVRKInvalidArgument  an out or another pointer that must not be null is null
 *   kVRKOutOfMemory
 *   kVRKNotRunning       the kernel is not running
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
#define kVRKAlreadyExists UINT32_C(4) /* the same registration exists */
#define kVRKNotRunning UINT32_C(5)
#define kVRKInUse UINT32_C(6)     /* cannot end: still in use */
#define kVRKNoResult UINT32_C(14) /* a callback returned 0 without a valid result handle */
#define kVRKOutOfMemory UINT32_C(18)
#define kVRKCallbackThrew UINT32_C(20) /* an exception left a callback, which is forbidden */
#define kVRKNotHandled UINT32_C(256)
#define kVRKCannotCoerce UINT32_C(512)

/* Data types. Payloads: text as bytes or 16-bit units, without terminator; a double, 8 bytes; a
 * bool, 1 byte that is not 0 for true; a token or handle, 4 bytes. */
#define kVRKTypeUTF8 "type:orvane.vrk.utf8"
#define kVRKTypeUTF16 "type:orvane.vrk.utf16" /* units in memory's byte order */
#define kVRKTypeUTF16LE "type:orvane.vrk.utf16le"
#define kVRKTypeUTF16BE "type:orvane.vrk.utf16be"
#define kVRKTypeDouble "type:orvane.vrk.double"
#define kVRKTypeBool "type:orvane.vrk.bool"
#define kVRKTypeNull "type:orvane.vrk.null"
#define kVRKTypeToken "type:orvane.vrk.token"
#define kVRKTypeList "type:orvane.vrk.list"
#define kVRKTypeDictionary "type:orvane.vrk.dictionary"

/* The message that an object's handlers receive when its last reference is released. */
#define kVRKMessageObjectDied "message:orvane.vrk.object-died"

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

/* Callbacks. `context` is the pointer that was registered with the callback. The pair of callback
 * and context identifies a factory or a coercion handler; a message handler is identified by its
 * registration. Handles passed in are borrowed. No exception may leave a callback. Once an
 * operation that removes a callback has returned, the callback is not called again, and its context
 * may be freed unless the callback is running on the same thread.
 */

/* Creates an object of the requested class and stores it in *outObject, owned by the caller.
 * `parameters` may be null. */
typedef VRKResult(VRK_CALL* VRKObjectFactoryCallback)(VRKToken objectClass,
                                                      VRKDictionary parameters, void* context,
                                                      VRKObject* outObject);

/* Returns 0 if it handled the message, kVRKNotHandled to pass it on to other handlers, or a failure
 * code. Results are stored in `parameters`, which may be null. */
typedef VRKResult(VRK_CALL* VRKMessageHandlerCallback)(VRKObject receiver, VRKToken message,
                                                       VRKDictionary parameters, void* context);

/* Stores the coerced data in *outData, owned by the caller, and returns 0; or returns
 * kVRKCannotCoerce or a failure code. */
typedef VRKResult(VRK_CALL* VRKDataCoercionCallback)(VRKData source, VRKToken fromType,
                                                     VRKToken toType, void* context,
                                                     VRKData* outData);

/* Objects */

/* Creates an object through the factory registered for its class, and stores it, owned by the
 * caller. The null class creates a plain object. `parameters` may be null. kVRKNotFound: no factory
 * is registered for the class. */
VRK_API VRKResult VRK_CALL VRKObjectCreate(VRKToken objectClass, VRKDictionary parameters,
                                           VRKObject* outObject);

/* Calls the object's handlers that asked for the message, newest first, until one returns a code
 * other than kVRKNotHandled, which becomes the result. `parameters` may be null. `flags` is 0 or 1;
 * the embedded kernel ignores it. */
VRK_API VRKResult VRK_CALL VRKObjectDeliverMessage(VRKObject object, VRKToken message,
                                                   VRKDictionary parameters, uint32_t flags);

/* Null is accepted and does nothing. When an object's last reference is released, those of its
 * handlers that asked for "message:orvane.vrk.object-died" receive it, each exactly once. The
 * handle is valid until they return, and retaining it does not keep the object alive. Then the
 * registrations of all its handlers end. */
VRK_API VRKResult VRK_CALL VRKObjectRetain(VRKObject object);
VRK_API VRKResult VRK_CALL VRKObjectRelease(VRKObject object);

/* Registers a factory for a class. Of several factories the latest one is used. kVRKAlreadyExists:
 * this factory is registered for the class. */
VRK_API VRKResult VRK_CALL VRKObjectFactoryRegister(VRKToken objectClass, uint32_t reserved,
                                                    VRKObjectFactoryCallback callback,
                                                    void* context);

/* Unregisters a factory from all classes. kVRKNotFound: it was not registered. */
VRK_API VRKResult VRK_CALL VRKObjectFactoryUnregister(uint32_t reserved,
                                                      VRKObjectFactoryCallback callback,
                                                      void* context);

/* Message handlers */

/* Attaches a handler to an object and stores the registration, which holds no reference to the
 * object. The handler receives no messages until VRKMessageHandlerAddMessages. */
VRK_API VRKResult VRK_CALL VRKMessageHandlerInstall(VRKObject object, uint32_t reserved1,
                                                    VRKMessageHandlerCallback callback,
                                                    void* context, uint32_t reserved2,
                                                    uint32_t reserved3,
                                                    VRKMessageHandler* outRegistration);

/* Adds to the messages that the handler receives. The registration ends after the handler has
 * received "message:orvane.vrk.object-died". `messages` may be null if `count` is 0. */
VRK_API VRKResult VRK_CALL VRKMessageHandlerAddMessages(VRKMessageHandler registration,
                                                        const VRKToken* messages, uint32_t count);

/* Ends the registration, also while the handler is being called. `object` is the one that it is
 * attached to. */
VRK_API VRKResult VRK_CALL VRKMessageHandlerRemove(VRKMessageHandler registration,
                                                   VRKObject object);

/* Tokens */

/* Stores the token of a text, which is never null. The kernel copies the text. Equal texts have
 * equal tokens; different texts have different ones. A token and the kernel's copy of its text are
 * valid until the process ends, also across a shut-down and restart of the kernel. `flag` is 1 if
 * the caller's text stays valid while its library is loaded, else 0; the embedded kernel ignores
 * it. */
VRK_API VRKResult VRK_CALL VRKTokenCreate(const char* text, uint32_t flag, VRKToken* outToken);

/* Returns the token's text, or null if there is no such token. */
VRK_API const char* VRK_CALL VRKTokenGetString(VRKToken token);

/* Data: immutable bytes with a type */

/* Copies the bytes and stores the data, owned by the caller. `bytes` may be null if `byteCount` is
 * 0. The payload of the types "type:orvane.vrk.token", "…list" and "…dictionary" is a token or
 * handle of four bytes. Data of a list or dictionary retains it. */
VRK_API VRKResult VRK_CALL VRKDataCreate(VRKToken type, const void* bytes, uint32_t byteCount,
                                         uint32_t reserved, VRKData* outData);

/* Each out may be null. *outBytes is readable while the data is held, and null if there are no
 * bytes. */
VRK_API VRKResult VRK_CALL VRKDataGetData(VRKData data, const void** outBytes,
                                          uint32_t* outByteCount, VRKToken* outType);

/* Stores data of the target type, owned by the caller. If the data has that type already, stores
 * the data itself or a copy. Text coerced to "type:orvane.vrk.utf16" begins with a byte-order mark.
 * kVRKCannotCoerce: impossible. */
VRK_API VRKResult VRK_CALL VRKDataCoerce(VRKData data, VRKToken toType, VRKData* outData);

/* Null is accepted and does nothing. */
VRK_API VRKResult VRK_CALL VRKDataRetain(VRKData data);
VRK_API VRKResult VRK_CALL VRKDataRelease(VRKData data);

/* Installs a handler that coerces data from one type to another. Of several handlers the latest one
 * is tried first. kVRKAlreadyExists: this handler is installed for the pair. */
VRK_API VRKResult VRK_CALL VRKDataCoercionHandlerInstall(VRKToken fromType, VRKToken toType,
                                                         uint32_t reserved,
                                                         VRKDataCoercionCallback callback,
                                                         void* context);

/* Removes the handler from all pairs of types. kVRKNotFound: it was not installed. */
VRK_API VRKResult VRK_CALL VRKDataCoercionHandlerRemove(VRKDataCoercionCallback callback,
                                                        void* context, uint32_t reserved1,
                                                        uint32_t reserved2);

/* Dictionaries: data by token */

/* Stores an empty dictionary, owned by the caller. */
VRK_API VRKResult VRK_CALL VRKDictionaryCreate(uint32_t reserved, VRKDictionary* outDictionary);

/* Stores a key's data in *outData, borrowed: valid until the entry is replaced or the dictionary is
 * destroyed. kVRKNotFound: the key has none. */
VRK_API VRKResult VRK_CALL VRKDictionaryGetEntry(VRKDictionary dictionary, VRKToken key,
                                                 VRKData* outData);

/* Sets or replaces a key's data, which must not be null. The dictionary retains the data. Entries
 * cannot be removed. */
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

/* Stores the data at an index, from 0, borrowed from the list. kVRKNotFound: the index is out of
 * range. */
VRK_API VRKResult VRK_CALL VRKListGetEntry(VRKList list, uint32_t index, VRKData* outData);

/* Null is accepted and does nothing. */
VRK_API VRKResult VRK_CALL VRKListRetain(VRKList list);
VRK_API VRKResult VRK_CALL VRKListRelease(VRKList list);

/* Memory */

/* Stores a block of that many bytes, aligned for any type and owned by the caller. It may be
 * deallocated after the kernel has been shut down. */
VRK_API VRKResult VRK_CALL VRKMemoryAllocate(uint32_t byteCount, uint32_t reserved,
                                             void** outBlock);

/* Null is accepted and does nothing. */
VRK_API VRKResult VRK_CALL VRKMemoryDeallocate(void* block);

/* Reports */

/* Reports a failed check. A result whose low byte is not 0 asks the caller to break into the
 * debugger. The kernel may set *onceFlag; the caller then skips this check from now on. `severity`
 * is 2 for a failed check; no text is null. */
VRK_API uint32_t VRK_CALL VRKRuntimeError(uint32_t severity, const char* domain,
                                          const char* expression, uint32_t reserved,
                                          const char* sourceFile, uint32_t line,
                                          const char* function, uint32_t* onceFlag);

#ifdef __cplusplus
} /* extern "C" */
#endif

#endif
