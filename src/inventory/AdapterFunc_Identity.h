// Product identity texts of an adapter: the branded model list, the 22
// character "11S" product IDs and their serial and part number parts, and the
// UUID-shaped tag made from a serial.
//
// The text results live in buffers of each function, one per thread,
// overwritten by the next call of that function on the same thread; callers
// use them at once.
#ifndef VEXLAN_INVENTORY_ADAPTERFUNC_IDENTITY_H
#define VEXLAN_INVENTORY_ADAPTERFUNC_IDENTITY_H

// 1 when the model is one of the branded mezzanine models (case ignored);
// 0 otherwise and for null.
int IsIBMBrandedAdapter(char* model);

// Trims the text in place, then 1 when it is 22 characters long and starts
// with "11S"; 0 otherwise and for null.
int IsIBM11SProductId(char* id);

// The serial part of an 11S product ID (its last 12 characters), or the
// trimmed text itself for any other form.
char* GetSerialNumberFromIBM11SProductId(char const* id);

// The seven characters 3 to 9 of an 11S product ID; null for another form.
// The ID is trimmed in place.
char* GetPartNumberFromIBM11SProductId(char* id);

// The first 16 characters of the serial as hex digit pairs over the digit
// places of "00000000-0000-0000-0000-000000000000". The buffer is never reset:
// a shorter serial leaves the tail of the one before.
char* ConvertSerialNumberToUUID(char* serial);

// The UUID form of an 11S ID's serial part, or of the text itself.
char* GetPhysicalPackageTag(char* id);

#endif
