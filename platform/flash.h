// Copy of the configuration to flash storage.
#pragma once

#ifdef __cplusplus
extern "C" {
#endif

// `flags` selects what to save; each handler passes its own flag word.
int LIB_CP_Config_To_MTD(int flags);

#ifdef __cplusplus
}
#endif
