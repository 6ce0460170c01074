#ifndef ORZAVS_TYPES_DIAGNOSTICS_H
#define ORZAVS_TYPES_DIAGNOSTICS_H

namespace OrzaVSMobile {

// Where the library's diagnostic lines go ("Skipped input frame: TSE not in RUNNING state" and
// the like). Each call receives one whole line, without its newline; `line` is valid only during
// the call. `context` is the pointer given to setDiagnosticSink.
//
// Lines arrive on the thread that produced them: a client thread inside a facade operation, the
// engine's worker thread, or the thread that pushes a server reply. Calls are serialised (one
// line at a time, across all threads), so the sink needs no lock of its own; it must return
// quickly and must not call into the library.
using DiagnosticSink = void (*)(void* context, const char* line);

// Installs `sink`, or the default one when `sink` is null. Safe to call from any thread at any
// time (but not from inside a sink): once it returns, the previous sink is no longer called.
//
// The default sink writes each line and a newline to standard output with the C library's
// puts; in an Android build it also writes the line to the Android log (tag "OrzaVSMobile",
// priority INFO), since an app's standard output goes nowhere there.
void setDiagnosticSink(DiagnosticSink sink, void* context);

}  // namespace OrzaVSMobile

#endif
