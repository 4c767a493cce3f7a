#ifndef QUORVEX_EXPORT_H
#define QUORVEX_EXPORT_H

// The library is built with hidden visibility; only what carries this macro is part of
// the interface that a host links against.
#define QUORVEX_API __attribute__((visibility("default")))

#endif  // QUORVEX_EXPORT_H
