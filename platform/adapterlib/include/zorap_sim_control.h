/*
 * zorap_sim_control.h - controls of the adapter library for tests and demos.
 *
 * These functions are exported by libzorap_cna_provider beside the ZORAP_*
 * interface.  A test in the same process uses them to choose the adapter
 * description, change live state, raise alarms, steer flash writes, inject
 * failures and count calls.  The provider itself never calls them.
 *
 * All functions are thread-safe.  Functions returning int give 0 on success
 * and -1 on failure; a bad argument or description also gives a message on
 * standard error, a timeout or a dropped alarm does not.
 */
#ifndef ZORAP_SIM_CONTROL_H
#define ZORAP_SIM_CONTROL_H

#include <stddef.h>
#include <stdint.h>

#ifdef __cplusplus
extern "C" {
#endif

/* Environment variable naming the description file; when unset the file
 * ZORAP_SIM_DEFAULT_FILE beside the library is used. */
#define ZORAP_SIM_ENV "ZORAP_SIM_ADAPTERS"
#define ZORAP_SIM_DEFAULT_FILE "zorap_sim_adapters.json"

/* The 23 interface functions, in the order of the interface. */
typedef enum zorap_sim_function {
    ZORAP_FN_Initialize = 0,
    ZORAP_FN_Uninitialize,
    ZORAP_FN_GetAdapterList,
    ZORAP_FN_DidConfigChange,
    ZORAP_FN_ResetConfigChange,
    ZORAP_FN_UpdateBackupAdapterList,
    ZORAP_FN_SwapBackupToMainAdapterList,
    ZORAP_FN_RegisterAlarmNotificationCallback,
    ZORAP_FN_UnRegisterAlarmNotificationCallback,
    ZORAP_FN_GetHbaDevicePortProperty,
    ZORAP_FN_RefreshDeviceStats,
    ZORAP_FN_GetVpd,
    ZORAP_FN_GetUUIDFromI2CVPD,
    ZORAP_FN_GetMBIVersionString,
    ZORAP_FN_GetSFPData,
    ZORAP_FN_GetOSName,
    ZORAP_FN_GetFCoELinkage,
    ZORAP_FN_GetLinkProperties,
    ZORAP_FN_GetTransceiverDMIData,
    ZORAP_FN_GetIPProperties,
    ZORAP_FN_UpdateFlash,
    ZORAP_FN_doOptionROMUpdate,
    ZORAP_FN_FreeMem,
    ZORAP_FN_COUNT
} zorap_sim_function;

/* "ZORAP_GetVpd" for ZORAP_FN_GetVpd; null for a value out of range. */
const char* zorap_sim_function_name(int function);
/* The function of a name, with or without the "ZORAP_" prefix; -1 if none. */
int zorap_sim_function_from_name(const char* name);

/* --- The description ---------------------------------------------------- */

/* Read a description file now and use it from here on; the file is watched
 * for changes like the default one.  A bad file leaves no adapters. */
int zorap_sim_load_file(const char* path);
/* Use a description given as JSON text.  Bad text leaves no adapters. */
int zorap_sim_load_json(const char* jsonText);
/* Go back to the environment variable or the default file, read now. */
int zorap_sim_load_default(void);
/* Path of the file in use, or "" for JSON text; valid until the next load. */
const char* zorap_sim_description_path(void);

/* In each load the configuration counts as changed; the trees change at the
 * next ZORAP_Initialize or at ZORAP_UpdateBackupAdapterList and swap. */

/* Look at the description file in use now, as ZORAP_DidConfigChange and the
 * alarm thread (once a second) do: 0 when it is unchanged or JSON text is in
 * use; 1 when it changed in live state only (FC port state and counters, NIC
 * link state, speed and counters), which the per-device and per-interface
 * calls now report, each FC port whose state changed having raised alarm
 * type 0 for its port index; 2 when its configuration changed, which
 * ZORAP_DidConfigChange reports and the next backup build reads. */
int zorap_sim_check_description(void);

/* --- Live state ---------------------------------------------------------- */

/* Link state (1 up, 2 down, 3 testing, or any value) of a NIC interface. */
int zorap_sim_set_link_state(const char* interfaceName, uint32_t linkState);
/* Link speed in Mbit/s of a NIC interface, reported while the link is up. */
int zorap_sim_set_link_speed(const char* interfaceName, uint64_t speedMbps);
/* State code (1 online, 2 suspended, 3 loop down, or any value) of the FC
 * function with this port WWN ("21:00:..." or 16 hex digits). */
int zorap_sim_set_fc_port_state(const char* portWWN, uint8_t stateCode);
/* Port counters of that FC function, nine values in the order of the device
 * record (io, megabytes, LIP, link failures, loss of sync, loss of signal,
 * primitive sequence errors, invalid transmission words, CRC errors). */
int zorap_sim_set_fc_port_stats(const char* portWWN, const uint32_t counters[9]);

/* --- Alarms --------------------------------------------------------------- */

/* Queue an alarm; the library's alarm thread calls the registered callback
 * with these arguments (text may be null: an empty text).  Alarms raised
 * while no callback is registered are dropped. */
int zorap_sim_raise_alarm(unsigned int deviceNumber, int coreAlarmType, const char* text);
/* Wait until every queued alarm has been delivered or dropped and no
 * callback runs; 0 when that happened within timeoutMs, -1 otherwise. */
int zorap_sim_wait_alarms_idle(uint32_t timeoutMs);
/* Number of callback calls made so far. */
unsigned long zorap_sim_alarms_delivered(void);

/* --- Flash writes ---------------------------------------------------------- */

/* The next flash write (either function) blocks durationMs and returns
 * result; later writes use the description's "flash" values again. */
void zorap_sim_set_next_flash(uint32_t result, uint32_t durationMs);
/* What reached the last flash write (either function) since the last
 * zorap_sim_reset: its image argument as a file name (cut to `size`) and
 * that file's size in bytes at the time of the write (-1 when it names no
 * regular file). 0, or -1 when no write has been made. */
int zorap_sim_last_flash_image(char* name, size_t size, long long* bytes);
/* Number of flash writes that have started but not yet returned. */
unsigned long zorap_sim_flash_writes_running(void);
/* Wait until exactly `count` flash writes are running; 0 when that happened
 * within timeoutMs, -1 otherwise. */
int zorap_sim_wait_flash_writes(unsigned long count, uint32_t timeoutMs);

/* --- Failures and counters ----------------------------------------------- */

/* Make the next `times` calls of a function fail with `code` (times < 0:
 * every call until cleared; code 0 or times 0: clear).  A failing call does
 * nothing but return the code; ZORAP_GetAdapterList returns null,
 * ZORAP_DidConfigChange returns the code, ZORAP_FreeMem still releases. */
int zorap_sim_fail(int function, uint32_t code, int times);
/* The same, from the callNumber-th call of the function from now on (1: the
 * next call); the calls before it succeed.  zorap_sim_fail is callNumber 1. */
int zorap_sim_fail_call(int function, uint32_t code, unsigned long callNumber, int times);
/* How often a function has been called since the process loaded the
 * library or since the last zorap_sim_reset. */
unsigned long zorap_sim_call_count(int function);
/* Blocks handed out through out-parameters and not yet given back. */
unsigned long zorap_sim_outstanding_allocations(void);

/* Clear failures, counters, the next-flash setting and queued alarms.  The
 * description, the trees and the live state stay as they are. */
void zorap_sim_reset(void);

#ifdef __cplusplus
} /* extern "C" */
#endif

#endif /* ZORAP_SIM_CONTROL_H */
