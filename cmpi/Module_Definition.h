// Defines a provider module from a table of its providers: the registration
// records (linked by one static initialiser, in table order), the static
// data of every provider and the exported MI factory functions.
//
// The including source (one per module, at global scope) defines
//   TVRN_MODULE_NAME  the module name, a string literal;
//   TVRN_MODULE_ROWS  the file holding the table, as an include name; its
//                     rows are TVRN_ROW(PROVIDER, SHORT, INSTANCE,
//                     ASSOCIATION, INDICATION): the provider class in
//                     namespace CPTA, the short name of its factories, and
//                     whether it has an instance, association and
//                     indication MI (literal 1 or 0; every provider has a
//                     method MI).
// For each row the module exports PROVIDER_Create_<Kind>MI and
// SHORT_Create_<Kind>MI for the kinds the row names. The providers' procs
// (TVRN_DEFINE_PROC) are defined in the providers' own sources.
//
// Static objects that the including source defines after this point are
// constructed after the registrations.
#ifndef CPTA_CMPI_MODULE_DEFINITION_H
#define CPTA_CMPI_MODULE_DEFINITION_H

#include <cmpidt.h>
#include <cmpift.h>
#include <cmpimacs.h>

#include "cmpi/CMPI_MI_Factory.h"
#include "cmpi/Provider_Proc.h"
#include "cmpi/Registration.h"

#if !defined(TVRN_MODULE_NAME) || !defined(TVRN_MODULE_ROWS)
#error "define TVRN_MODULE_NAME and TVRN_MODULE_ROWS before including Module_Definition.h"
#endif

#define TVRN_IF_0(...)
#define TVRN_IF_1(...) __VA_ARGS__
#define TVRN_IF(FLAG, ...) TVRN_IF_##FLAG(__VA_ARGS__)

// The procs.
namespace CPTA {
#define TVRN_ROW(P, S, I, A, N) TVRN_DECLARE_PROC(P);
#include TVRN_MODULE_ROWS
#undef TVRN_ROW
}  // namespace CPTA

namespace {

// Index of each provider in the table.
enum {
#define TVRN_ROW(P, S, I, A, N) TVRN_INDEX_##P,
#include TVRN_MODULE_ROWS
#undef TVRN_ROW
    TVRN_NUM_PROVIDERS
};

::CPTA::Registration _registrations[] = {
#define TVRN_ROW(P, S, I, A, N) {TVRN_MODULE_NAME, #P, &::CPTA::P##_proc, nullptr, nullptr},
#include TVRN_MODULE_ROWS
#undef TVRN_ROW
};

static_assert(sizeof(_registrations) / sizeof(_registrations[0]) == TVRN_NUM_PROVIDERS,
              "one registration per row");

// Links every record, in table order, when the module is loaded.
struct Registrar {
    Registrar() {
        for (::CPTA::Registration& registration : _registrations)
            ::CPTA::register_provider(&registration);
    }
} _registrar;

}  // namespace

// The static data of every provider (zero until its first MI is created).
#define TVRN_ROW(P, S, I, A, N) ::CPTA::CMPI_Static_Data _cmpi_static_data_##P;
#include TVRN_MODULE_ROWS
#undef TVRN_ROW

#define TVRN_FACTORY(P, S, KIND, LETTER)                                                         \
    extern "C" CMPI_EXPORT CMPI##KIND##MI* P##_Create_##KIND##MI(                                \
        const CMPIBroker* broker, const CMPIContext* context, CMPIStatus* rc) {                  \
        return static_cast<CMPI##KIND##MI*>(::CPTA::create_mi(&_cmpi_static_data_##P,            \
                                                              &_registrations[TVRN_INDEX_##P],   \
                                                              broker, context, #P, LETTER, rc)); \
    }                                                                                            \
    extern "C" CMPI_EXPORT CMPI##KIND##MI* S##_Create_##KIND##MI(                                \
        const CMPIBroker* broker, const CMPIContext* context, CMPIStatus* rc) {                  \
        return P##_Create_##KIND##MI(broker, context, rc);                                       \
    }

#define TVRN_ROW(P, S, I, A, N)                      \
    TVRN_FACTORY(P, S, Method, 'M')                  \
    TVRN_IF(I, TVRN_FACTORY(P, S, Instance, 'I'))    \
    TVRN_IF(A, TVRN_FACTORY(P, S, Association, 'A')) \
    TVRN_IF(N, TVRN_FACTORY(P, S, Indication, 'N'))
#include TVRN_MODULE_ROWS
#undef TVRN_ROW

#undef TVRN_FACTORY

#endif
