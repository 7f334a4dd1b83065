// Marks what the plug-in library exports; everything else is built hidden.
#pragma once

#if defined(_WIN32)
#define ZRBXMLS_API __declspec(dllexport)
#else
#define ZRBXMLS_API __attribute__((visibility("default")))
#endif
