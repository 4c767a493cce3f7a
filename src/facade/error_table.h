#ifndef QUORVEX_FACADE_ERROR_TABLE_H
#define QUORVEX_FACADE_ERROR_TABLE_H

// The text of a result code of the library or of the analytics engine; "Unknown error code."
// for any other value. The text is storage of the library that lives as long as the process.
char* ErrorTextOf(int code);

#endif  // QUORVEX_FACADE_ERROR_TABLE_H
