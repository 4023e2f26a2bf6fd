// Marks the driver functions of kvsvplatform.h that this library exports; everything else in it
// stays hidden.
#ifndef KVOR_SIM_DRIVER_EXPORT_H
#define KVOR_SIM_DRIVER_EXPORT_H

#define KVOR_DRIVER_API extern "C" __attribute__((visibility("default")))

#endif
