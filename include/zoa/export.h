// Symbol visibility for libZOA: only classes marked ZOA_API leave the shared library.
#ifndef ZOA_EXPORT_H
#define ZOA_EXPORT_H

#if defined(_WIN32)
#define ZOA_API
#else
#define ZOA_API __attribute__((visibility("default")))
#endif

#endif
