/* What the host's kernel calls of the plug-in. C11 and C++20.
 *
 * One at a time, and not while it creates the plug-in's objects, delivers messages to them or
 * coerces through the plug-in. `reserved` is 0, or 13 is the result and nothing is done. Other
 * results are 0, the kernel's, 18 where there is no memory, and those of ResultCodes.h.
 */
#ifndef VRK_KOLVANES_H
#define VRK_KOLVANES_H

#include "VarnelKernel.h"

#if defined(_WIN32)
#define VRK_KOLVANES_API /* VRKKolvanes.def exports them, at the ordinals 1 to 3 */
#else
#define VRK_KOLVANES_API __attribute__((visibility("default")))
#endif

#ifdef __cplusplus
extern "C" {
#endif

/* Registers both classes of translators, makes a first translator the default, and installs the
 * coercion of keys. The kernel is to keep the objects that are created meanwhile until the plug-in
 * is terminated: the first translator dies with its object. When the classes fail, neither is
 * registered any more; when the coercion does, the classes stay and VRKKolvanesTerminate removes
 * them. A second call without a VRKKolvanesTerminate replaces all that the first made; should the
 * classes fail then, the coercion of the first stays until VRKKolvanesTerminate. */
VRK_KOLVANES_API VRKResult VRK_CALL VRKKolvanesInitialize(uint32_t reserved);

/* Removes what was registered and installed. Translators stay, the default one among them. The
 * plug-in can be initialised again. A library that is unloaded without it unregisters the classes
 * by itself, but not the coercion; nor must it be unloaded while there are translators. */
VRK_KOLVANES_API VRKResult VRK_CALL VRKKolvanesTerminate(uint32_t reserved);

/* 0x00010000. */
VRK_KOLVANES_API uint32_t VRK_CALL VRKKolvanesVersion(void);

#ifdef __cplusplus
} /* extern "C" */
#endif

#endif
