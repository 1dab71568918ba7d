// Start-up and shut-down of the adapter management library.
//
// The module holds exactly one ProviderInit, gProviderInit, defined in the
// module's own translation unit so that it is constructed while the CIM
// server loads the module and destroyed when it unloads it. Construction binds
// the library, hooks its log output into ours, initialises it and counts the
// adapters; the outcome is recorded in driverStatus. Nothing here throws.
#ifndef CPTA_GATEWAY_PROVIDERINIT_H
#define CPTA_GATEWAY_PROVIDERINIT_H

namespace CPTA {

class ProviderInit {
public:
    ProviderInit();
    ~ProviderInit();

    ProviderInit(const ProviderInit&) = delete;
    ProviderInit& operator=(const ProviderInit&) = delete;

    static int getDriverStatus();

    // Whether a library reporting this version text gets our log callback:
    // characters 0, 2 and 4 must be above '2', '1' and '0' respectively.
    // A null text or one shorter than five characters does not qualify.
    static bool acceptsLogCallback(const char* version);

    // 0: library initialised and at least one adapter present.
    // 1: library missing, initialisation failed, or no adapter (the only
    //    values the constructor records).
    // 2, 3: driver not installed / driver library mismatch.
    // Written only by the constructor; read without locking afterwards.
    static int driverStatus;

private:
    void start();

    bool _logCallbackRegistered = false;
};

// The module's single instance (defined in the module, not in this library).
extern ProviderInit gProviderInit;

}  // namespace CPTA

#endif
