// The device's XML configuration store, "/etc/NAS_CFG/config.xml". A key such as
// "/system_mgr/nfs/enable" is the element path below the document's root element.
#pragma once

#ifdef __cplusplus
extern "C" {
#endif

// Copies the key's text into `buffer` (at most size-1 bytes, terminated) and returns 0.
// A missing key returns -1 and leaves `buffer` exactly as it was.
int xml_get_str(const char* path, int size, char* buffer);

// The key's value as a decimal number; a negative number when the key is missing
// or its text is not a number.
int xml_get_int(const char* path);

// Sets the key's text in the loaded document, creating missing elements. Returns 0.
int xml_set_str(const char* path, const char* value);

// Saves the loaded document to `file`. Returns 0, or -1 when it cannot be written.
int xml_write_file(const char* file);

#ifdef __cplusplus
}
#endif
