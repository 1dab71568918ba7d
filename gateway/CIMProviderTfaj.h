// Binding of the adapter management library libdtfaj.so.
//
// setupDLLEntryPoints() opens the library by its plain file name and resolves
// every entry point listed in gateway/EntryPoints.def into a process-wide
// pointer named lib<EntryPoint> (libGetHbaByWwn, libInitHbaLib, ...).
//
// Every pointer always holds something callable: before binding, when the
// library cannot be loaded, and when a loaded library lacks a symbol, it holds
// the fallback of its kind, which answers "nothing" (a null Json::Value, -1,
// 0xFFFF or a null text) and registers nothing. Callers therefore call the
// pointers directly and test the answer (ProviderUtil::isValidJsonResponse).
//
// The pointers, libHandle and gTfajLibLoaded are written only while the
// module loads, before any request thread exists; afterwards they are read
// without locking.
#ifndef CPTA_GATEWAY_CIMPROVIDERTFAJ_H
#define CPTA_GATEWAY_CIMPROVIDERTFAJ_H

#include <json/json.h>

#include "gateway/HbaAgentError.h"

namespace CPTA {

// Callbacks the library calls.
typedef void (*EvtProcessCB)(const char* event);
typedef void (*LogMsgCB)(int level, const char* file, int line, const char* message);

// Signatures of the entry points, one per kind.
typedef Json::Value (*JsonReqFP)(const Json::Value& request);
typedef int (*VoidRetIntFP)();
typedef unsigned int (*VoidRetUIntFP)();
typedef const char* (*VoidRetStrFP)();
typedef void (*EvtProcessCBRetVoidFP)(EvtProcessCB callback);
typedef void (*Log4cxxMsgRetVoidFP)(LogMsgCB callback);
typedef void (*JsonReqVoidFP)(const Json::Value& request);

// Fallbacks, one per kind.
Json::Value default_JsonReqFP(const Json::Value& request);  // null value
int default_voidRetIntFP();                                 // -1
unsigned int default_voidRetUIntFP();                       // 65535
const char* default_voidRetStrFP();                         // null pointer
void default_evtProcessCBRetVoidFP(EvtProcessCB callback);  // nothing
void default_log4cxxMsgRetVoidFP(LogMsgCB callback);        // nothing
void default_JsonReqVoidFP(const Json::Value& request);     // nothing (no entry point uses it)

// Kind names of EntryPoints.def mapped to their pointer types and fallbacks.
#define TVRN_EP_TYPE_JSON JsonReqFP
#define TVRN_EP_TYPE_INT_QUERY VoidRetIntFP
#define TVRN_EP_TYPE_UINT_QUERY VoidRetUIntFP
#define TVRN_EP_TYPE_STRING_QUERY VoidRetStrFP
#define TVRN_EP_TYPE_EVENT_CB EvtProcessCBRetVoidFP
#define TVRN_EP_TYPE_LOG_CB Log4cxxMsgRetVoidFP

#define TVRN_EP_DEFAULT_JSON default_JsonReqFP
#define TVRN_EP_DEFAULT_INT_QUERY default_voidRetIntFP
#define TVRN_EP_DEFAULT_UINT_QUERY default_voidRetUIntFP
#define TVRN_EP_DEFAULT_STRING_QUERY default_voidRetStrFP
#define TVRN_EP_DEFAULT_EVENT_CB default_evtProcessCBRetVoidFP
#define TVRN_EP_DEFAULT_LOG_CB default_log4cxxMsgRetVoidFP

// The entry-point pointers: extern JsonReqFP libGetHost; ...
#define ENTRY_POINT(kind, symbol, pointer) extern TVRN_EP_TYPE_##kind pointer;
#include "gateway/EntryPoints.def"
#undef ENTRY_POINT

// Number of entry points in the table.
extern const int kEntryPointCount;

// Loader handle of the library; null when it could not be loaded. Never closed.
extern void* libHandle;
// True once the library has been opened.
extern bool gTfajLibLoaded;

// Opens the library and binds every entry point (see above). Binds once per
// process; later calls do nothing.
void setupDLLEntryPoints();

}  // namespace CPTA

#endif
