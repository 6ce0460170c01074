#ifndef ORZAVS_TYPES_DIAGNOSTICOUTPUT_H
#define ORZAVS_TYPES_DIAGNOSTICOUTPUT_H

// How the library's own code prints a diagnostic line: through the sink of types/Diagnostics.h.

namespace OrzaVSMobile {

// One line, without its newline.
void reportLine(const char* line) noexcept;

// One line formatted as printf does, without its newline.
#if defined(__GNUC__)
__attribute__((format(printf, 1, 2)))
#endif
void reportLinef(const char* format, ...) noexcept;

}  // namespace OrzaVSMobile

#endif
