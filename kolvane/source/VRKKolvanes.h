/* The plug-in's entry points, which the host's kernel calls. C11 and C++20.
 *
 * Requires: one call at a time, and none while the kernel creates the plug-in's objects, delivers
 * messages to them or coerces through the plug-in. `reserved` is 0.
 *
 * Results: 0; 13 if `reserved` is not 0, and nothing was done; 18 if memory runs out; any other
 * code of the kernel or of ResultCodes.h.
 */
#ifndef VRK_KOLVANES_H
#define VRK_KOLVANES_H

#include "wrapper-framework/source/VarnelKernel.h"

#if defined(_WIN32)
#define VRK_KOLVANES_API /* VRKKolvanes.def exports them, at the ordinals 1 to 3 */
#else
#define VRK_KOLVANES_API __attribute__((visibility("default")))
#endif

#ifdef __cplusplus
extern "C" {
#endif

/* Registers both translator classes, creates a translator and makes it the default, and installs
 * the coercion of keys. Requires: the kernel retains the objects created meanwhile until the
 * plug-in is terminated, because the default translator dies with its object.
 *
 * If registering the classes fails, neither stays registered. If installing the coercion fails, the
 * classes stay until VRKKolvanesTerminate. A second call without VRKKolvanesTerminate registers the
 * classes again, creates another default translator and replaces the coercion; if registering fails
 * then, no class stays registered and the old coercion stays installed. */
VRK_KOLVANES_API VRKResult VRK_CALL VRKKolvanesInitialize(uint32_t reserved);

/* Unregisters the classes and removes the coercion. Translators stay, including the default one.
 * The plug-in can be initialised again. Unloading the library without this call unregisters the
 * classes, but not the coercion. The library must not be unloaded while translators exist. */
VRK_KOLVANES_API VRKResult VRK_CALL VRKKolvanesTerminate(uint32_t reserved);

/* Returns 0x00010000. */
VRK_KOLVANES_API uint32_t VRK_CALL VRKKolvanesVersion(void);

#ifdef __cplusplus
} /* extern "C" */
#endif

#endif
