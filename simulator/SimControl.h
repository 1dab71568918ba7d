/* Control interface of the adapter-library simulator libdtfaj.so, for tests,
 * benchmarks and tools. Link the simulator, or dlopen("libdtfaj.so") and look
 * the functions up by name. Every function is safe to call from any thread. */
#ifndef TVRN_SIMULATOR_SIMCONTROL_H
#define TVRN_SIMULATOR_SIMCONTROL_H

#ifdef __cplusplus
extern "C" {
#endif

/* What an injected fault does to a call of a JSON entry point. */
enum tvrn_sim_fault_kind {
    TVRN_SIM_FAULT_NULL_ANSWER = 1,     /* answer a null value */
    TVRN_SIM_FAULT_ERROR_OBJECT = 2,    /* answer {"error": {"name", "code", "message": text}} */
    TVRN_SIM_FAULT_HBA_AGENT_ERROR = 3, /* throw CPTA::HbaAgentError{code, text} */
    TVRN_SIM_FAULT_STD_EXCEPTION = 4,   /* throw std::runtime_error(text) */
    TVRN_SIM_FAULT_NON_STANDARD = 5,    /* throw the int code (no std::exception) */
    TVRN_SIM_FAULT_DROP_MEMBER = 6,     /* remove member text ("a.b", "0.c") from the answer */
    TVRN_SIM_FAULT_WRONG_TYPE = 7,      /* replace member text with a value of another JSON type */
    TVRN_SIM_FAULT_DELAY = 8            /* wait `code` milliseconds, then answer as usual */
};

/* Loads a fixture: "default" (or "default.json") is the built-in host, compiled
 * into the library; another bare name is looked up in the fixtures directory
 * next to the library (".json" may be left out); anything with a '/' is a path.
 * NULL selects the start-up host: $TVRN_SIM_FIXTURE when set, else the built-in
 * host. Replaces the host, the version text, the init result and the faults;
 * state changes are discarded. Returns 0, or -1 when the fixture cannot be
 * used: the host then has no adapters and tvrn_sim_last_error() says why. */
int tvrn_sim_load_fixture(const char* nameOrPath);
/* The same from JSON text. */
int tvrn_sim_load_fixture_text(const char* jsonText);
/* Back to the start-up host (as tvrn_sim_load_fixture(NULL)) with no faults,
 * and clears the call counters, the recorded calls, request ids, diagnostic
 * requests and queued events. Event and callback registrations are kept. */
int tvrn_sim_reset(void);
/* Why the last load failed; "" after a successful load. Valid until the next
 * call of this function on the same thread. */
const char* tvrn_sim_last_error(void);
/* The fixtures directory next to the library. Same lifetime rule. */
const char* tvrn_sim_fixture_dir(void);

/* The text get_agt_version answers (default "3.2.1"); NULL makes it answer NULL. */
void tvrn_sim_set_version(const char* text);
/* The "result" init_hba_lib answers (default 0). */
void tvrn_sim_set_init_result(int result);

/* Injects a fault into the JSON entry point `entryPoint`. With a non-empty
 * `key` it fires only for requests that have a top-level string member equal to
 * it (any case); such faults take precedence over ones without a key. `code`
 * and `text` are used as the kind says. `times` > 0 fires that many times, then
 * the fault is gone; otherwise it stays until cleared. Returns 0, or -1 for an
 * unknown or non-JSON entry point, an unknown kind, a member fault without
 * `text`, or a delay outside 0 to 600000 milliseconds. */
int tvrn_sim_set_fault(const char* entryPoint, const char* key, int kind, int code,
                       const char* text, int times);
/* The same, but the first `skip` calls the fault would fire for are answered
 * as usual (and do not count against `times`): with skip 1 and times 1 it
 * fires on the second matching call only. -1 also for a negative `skip`. */
int tvrn_sim_set_fault_after(const char* entryPoint, const char* key, int kind, int code,
                             const char* text, int skip, int times);
void tvrn_sim_clear_faults(void);

/* Calls of one entry point (any kind) since the last counter reset; 0 for an
 * unknown name. */
unsigned long long tvrn_sim_call_count(const char* entryPoint);
unsigned long long tvrn_sim_total_calls(void);
void tvrn_sim_reset_counters(void);
/* Calls made after free_hba_lib other than a new start (get_agt_version,
 * registering a log callback, init_hba_lib); each is reported on stderr, and
 * a JSON entry point then answers an "error" object. tvrn_sim_reset() clears
 * the count; init_hba_lib ends the freed state. */
unsigned long long tvrn_sim_calls_after_free(void);

/* The calls since the recording was last cleared, oldest first, as the text of
 * one JSON array: [{"entry": "getHbaByWwn", "request": {"wwn": "..."}}, ...].
 * Entry points that take no JSON request are listed with a null "request";
 * faulted calls are listed too. Only the latest 100000 calls are kept. Valid
 * until the next call of this function on the same thread. */
const char* tvrn_sim_recorded_calls(void);
/* Calls that were dropped from the recording because it was full. */
unsigned long long tvrn_sim_recorded_dropped(void);
void tvrn_sim_clear_recording(void);

/* Queues an event text for the registered callback, delivered on the
 * simulator's event thread. Returns 1 when queued, 0 when dropped because no
 * client is registered for events, -1 for a NULL text. */
int tvrn_sim_emit_event(const char* text);
/* Waits until every queued event has been delivered: 0, or -1 on timeout. */
int tvrn_sim_wait_events(int timeoutMs);
/* Events delivered to a callback so far. */
unsigned long long tvrn_sim_events_delivered(void);

#ifdef __cplusplus
}
#endif

#endif
