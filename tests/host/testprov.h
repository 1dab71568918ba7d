/* Counters the test provider library exports so that tests can observe the
 * calls the host made into it (looked up with dlsym). */
#ifndef TVRN_TESTS_HOST_TESTPROV_H
#define TVRN_TESTS_HOST_TESTPROV_H

#ifdef __cplusplus
extern "C" {
#endif

struct tvrntest_counters {
    int factoryCalls;
    int authorizeCalls;
    int activateCalls;
    int firstActivations;
    int deactivateCalls;
    int lastDeactivations;
    int enableCalls;
    int disableCalls;
    int threadsAttached;
    int threadsDetached;
};

#ifdef __cplusplus
}
#endif

#endif
