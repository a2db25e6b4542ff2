/**
 * \file
 * The C face of the companion library: a car behind an adapter, for every language that can call C.
 *
 * Strings are UTF-8 and end in a 0. What goes in is copied. What a callback is given is borrowed: it is valid until the
 * callback returns. What comes back through a `char**` belongs to the caller, who gives it to velmora_free.
 *
 * Functions that can fail return 0, or one of the codes below, which are the exit codes of the velmora program. They
 * also leave an error object in `*error`, if `error` is not NULL, which the caller gives to velmora_error_free; on
 * success `*error` is NULL. No C++ exception leaves the library, and a callback must not let one out.
 *
 * Structs begin with their size. Members are only ever added behind the last one. In a struct from the caller, `size`
 * is what the caller's compiler knows of it (the INIT macro sets it); in a struct to the caller, it is what the library
 * has filled in: before a member that came later, compare it with offsetof.
 *
 * A process has one car at a time.
 */
#ifndef VELMORA_VELMORA_H
#define VELMORA_VELMORA_H

#include <stddef.h>
#include <stdint.h>

/** What the library shows. */
#define VELMORA_API __attribute__((visibility("default")))

/** \addtogroup cface
 *  @{ */

#ifdef __cplusplus
extern "C" {
#endif

/** Rises when something that callers rely on changes; what is added leaves it as it is. */
#define VELMORA_ABI_VERSION 1

/** A car behind an adapter. */
typedef struct velmora_car velmora_car;
/** Readings that come over and over. */
typedef struct velmora_watch velmora_watch;
/** Why something could not be done. */
typedef struct velmora_error velmora_error;

/** What functions return. */
enum
{
    VELMORA_OK = 0,             /**< done */
    VELMORA_FAILED = 1,         /**< for a reason that no other code names */
    VELMORA_WRONG_USE = 2,      /**< what was asked for makes no sense */
    VELMORA_PORT_FAILED = 3,    /**< the port could not be opened */
    VELMORA_ADAPTER_SILENT = 4, /**< nothing that looks like an adapter answers */
    VELMORA_VEHICLE_SILENT = 5, /**< the adapter works, no control module answers */
    VELMORA_NOT_SUPPORTED = 6,  /**< the vehicle does not offer what was asked for */
    VELMORA_REFUSED = 7,        /**< the vehicle said no */
    VELMORA_LINK_LOST = 8,      /**< the connection broke; see velmora_car_reconnect */
    VELMORA_INTERRUPTED = 130   /**< the user wanted an end */
};

/** Whether a control module told of a topic. Where it did not, the values beside it say nothing. */
enum
{
    VELMORA_ANSWER_READ = 0,        /**< it did */
    VELMORA_ANSWER_NOT_OFFERED = 1, /**< by what the module says it supports, so that it was not asked */
    VELMORA_ANSWER_SILENT = 2,      /**< no answer in time */
    VELMORA_ANSWER_UNREADABLE = 3,  /**< it answered in a form that can't be decoded */
    VELMORA_ANSWER_REFUSED = 4      /**< by a negative reply */
};

/** A yes or no that may not have been told. */
enum
{
    VELMORA_NO = 0,    /**< told: no */
    VELMORA_YES = 1,   /**< told: yes */
    VELMORA_UNTOLD = 2 /**< not told */
};

/* Errors. All functions take NULL for "no error". */

/** The code that the function has returned. Any thread, one at a time for one error. */
VELMORA_API int velmora_error_code(velmora_error const* error);
/** What was tried and what happened. Borrowed from the error. Any thread, one at a time for one error. */
VELMORA_API char const* velmora_error_message(velmora_error const* error);
/** How many things there are to try next. Any thread, one at a time for one error. */
VELMORA_API size_t velmora_error_hint_count(velmora_error const* error);
/**
 * One of them, the likeliest first; NULL beyond the last one. Borrowed from the error. Any thread, one at a time for
 * one error.
 */
VELMORA_API char const* velmora_error_hint(velmora_error const* error, size_t index);
/** Gives the object back; NULL is fine. Any thread, once for one error. */
VELMORA_API void velmora_error_free(velmora_error* error);

/** Gives back what came through a `char**`; NULL is fine. Any thread. */
VELMORA_API void velmora_free(void* memory);
/** VELMORA_ABI_VERSION of the library that runs. Any thread. */
VELMORA_API int velmora_abi_version(void);
/** The version of the library that runs, such as "0.1.0". Any thread; never freed. */
VELMORA_API char const* velmora_version(void);

/* The car. */

/** What the car is at while it connects and reads, as lines with their line feeds. On the car's thread. */
typedef void (*velmora_progress_fn)(char const* text, void* user);

/** The units that values are told in. */
enum
{
    VELMORA_UNITS_BY_SETTINGS = 0, /**< as the settings file says */
    VELMORA_UNITS_METRIC = 1,      /**< km/h, Celsius, kPa */
    VELMORA_UNITS_IMPERIAL = 2,    /**< mph, Fahrenheit, psi, gallons of the US */
    VELMORA_UNITS_IMPERIAL_UK = 3  /**< the same with gallons of the United Kingdom */
};

/** How a car is to be reached. What is NULL or 0 comes from the settings file, or is the default. */
typedef struct velmora_options
{
    size_t size;                     /**< VELMORA_OPTIONS_INIT sets it */
    char const* settings_file;       /**< velmora/settings.toml in the user's configuration folder if NULL */
    char const* log_file;            /**< gets what the library says of its work */
    char const* trace_file;          /**< gets the traffic with the adapter */
    velmora_progress_fn on_progress; /**< told of the progress */
    void* progress_user;             /**< given to on_progress */
    uint32_t baud;                   /**< line rate of a serial port */
    uint32_t protocol;               /**< the adapter's number of the bus, 1 to 9 */
    uint32_t reset;                  /**< not 0: restore and reset the adapter before use */
    uint32_t module;                 /**< id of the one control module to ask, such as 0x7E8; all of them if 0 */
    uint32_t units;                  /**< VELMORA_UNITS_... */
    uint32_t sleep; /**< not 0: send the adapter to sleep at the end, which costs the next visit time */
} velmora_options;

/** What an object of velmora_options begins with. */
#define VELMORA_OPTIONS_INIT                                                                                           \
    {                                                                                                                  \
        sizeof(velmora_options), NULL, NULL, NULL, NULL, NULL, 0, 0, 0, 0, 0, 0                                        \
    }

/**
 * Connects. `port` is what the program's --port takes: "192.168.0.10:35000", "/dev/ttyUSB0", "sim:petrol-can11".
 * `options` may be NULL. Waits until the car answers or it is known that it does not. Any thread.
 */
VELMORA_API int velmora_car_open(char const* port, velmora_options const* options, velmora_car** car,
                                 velmora_error** error);

/**
 * Closes the connection and frees the car; NULL is fine. Watches of it that were not stopped call no more, and are
 * still to be given to velmora_watch_stop. Any thread, while no other one is in a function of this car; from one of the
 * car's callbacks it does nothing and returns VELMORA_WRONG_USE.
 */
VELMORA_API int velmora_car_close(velmora_car* car);

/*
 * All functions below wait for the car. They may be called from any thread, and from several at once, but not from a
 * callback of a watch or of the progress, where they return VELMORA_WRONG_USE. They return VELMORA_LINK_LOST once the
 * link is gone. Their own callbacks run on the calling thread after all has been read, so that those may call anything.
 */

/** Connects anew after a loss. Waits for the car. Any thread, but no callback of a watch or of the progress. */
VELMORA_API int velmora_car_reconnect(velmora_car* car, velmora_error** error);

/** A control module that answers. */
typedef struct velmora_module
{
    size_t size;             /**< what the library has filled in, in bytes */
    char const* name;        /**< such as "ECM" */
    char const* description; /**< such as "Engine Control" */
    uint32_t id;             /**< 0x7E8 */
    uint32_t unused;         /**< 0 */
} velmora_module;
/** Gets a control module. On the thread that called the function, before that returns. */
typedef void (*velmora_module_fn)(velmora_module const* module, void* user);
/** Tells each control module. Waits for the car. Any thread, but no callback of a watch or of the progress. */
VELMORA_API int velmora_car_modules(velmora_car* car, velmora_module_fn fn, void* user, velmora_error** error);

/** A sensor that a control module offers. */
typedef struct velmora_sensor
{
    size_t size;       /**< what the library has filled in, in bytes */
    char const* key;   /**< "RPM" */
    char const* pid;   /**< "010C"; empty for a derived value */
    char const* title; /**< "Engine RPM" */
    uint32_t module;   /**< id of the control module, such as 0x7E8 */
    uint32_t unused;   /**< 0 */
} velmora_sensor;
/** Gets a sensor. On the thread that called the function, before that returns. */
typedef void (*velmora_sensor_fn)(velmora_sensor const* sensor, void* user);
/**
 * Tells each sensor of each control module. Waits for the car. Any thread, but no callback of a watch or of the
 * progress.
 */
VELMORA_API int velmora_car_sensors(velmora_car* car, velmora_sensor_fn fn, void* user, velmora_error** error);

/** What a reading holds. */
enum
{
    VELMORA_VALUE_NONE = 0,   /**< the module did not tell it */
    VELMORA_VALUE_NUMBER = 1, /**< in `number`, and in `text` with the digits that it is good for */
    VELMORA_VALUE_TEXT = 2    /**< in `text`: a state, or a list */
};

/** One value of one sensor of one control module at one moment. */
typedef struct velmora_reading
{
    size_t size;        /**< what the library has filled in, in bytes */
    char const* sensor; /**< stable key: "RPM" */
    char const* pid;    /**< "010C"; empty for a derived value */
    char const* name;   /**< title for people: "Engine RPM" */
    char const* text;   /**< "-" for no value */
    char const* unit;   /**< "rpm"; empty for none */
    uint8_t const* raw; /**< the module's payload from the service byte on */
    size_t raw_size;    /**< 0 for a derived value */
    double number;      /**< not a number (NaN) unless `value` is VELMORA_VALUE_NUMBER */
    int64_t time_ns;    /**< since 1970, by the wall clock */
    uint32_t module;    /**< id of the control module, such as 0x7E8 */
    uint32_t value;     /**< VELMORA_VALUE_... */
} velmora_reading;
/** Gets a reading. On the thread that called velmora_car_read, or on the car's for a watch. */
typedef void (*velmora_reading_fn)(velmora_reading const* reading, void* user);

/**
 * Reads sensors once, in the order of the names, which are the program's: "RPM", "0C", "coolant", "7E9:RPM", all of a
 * module by "all". With a count of 0 the usual ones. Waits for the car. Any thread, but no callback of a watch or of
 * the progress.
 */
VELMORA_API int velmora_car_read(velmora_car* car, char const* const* names, size_t count, velmora_reading_fn fn,
                                 void* user, velmora_error** error);

/** What became of the link while a watch goes on. */
enum
{
    VELMORA_LINK_IS_LOST = 0,     /**< no readings come; the car tries to come back */
    VELMORA_LINK_HAS_RETURNED = 1 /**< readings come again */
};
/** Hears of a loss (VELMORA_LINK_IS_LOST) or a return of the link. On the car's thread. */
typedef void (*velmora_link_fn)(int state, void* user);

/**
 * Reads over and over until velmora_watch_stop; "RPM@10hz" asks for a rate. Both functions are called on the car's
 * thread, one call at a time; of what stands here they may call velmora_watch_stop and what takes no car. `on_link` may
 * be NULL; after a loss the car tries to come back for as long as there is a watch. Waits for the car to take it up.
 * Any thread, but no callback of a watch or of the progress.
 */
VELMORA_API int velmora_car_watch(velmora_car* car, char const* const* names, size_t count,
                                  velmora_reading_fn on_reading, velmora_link_fn on_link, void* user,
                                  velmora_watch** watch, velmora_error** error);

/**
 * Ends the watch and frees it; NULL is fine. Once it has returned no call of it runs or comes; from inside one of its
 * own calls, none comes after that one. Any thread.
 */
VELMORA_API void velmora_watch_stop(velmora_watch* watch);

/** How firmly a trouble code is stored. */
enum
{
    VELMORA_CODE_CONFIRMED = 0, /**< stored, and as a rule the reason for the lamp */
    VELMORA_CODE_PENDING = 1,   /**< seen in this or the last driving cycle */
    VELMORA_CODE_PERMANENT = 2  /**< not to be cleared by a tool */
};

/** A trouble code, or that a list of a control module has none or was not told. */
typedef struct velmora_code
{
    size_t size;             /**< what the library has filled in, in bytes */
    char const* code;        /**< "P0171"; NULL for a list without codes: nothing is stored if it was read */
    char const* text;        /**< its meaning for this vehicle; NULL without a code */
    char const* reason;      /**< of a refusal; else empty */
    char const* module_name; /**< such as "ECM" */
    uint32_t module;         /**< id of the control module, such as 0x7E8 */
    uint32_t kind;           /**< VELMORA_CODE_... */
    uint32_t answer;         /**< VELMORA_ANSWER_..., of the list */
    uint32_t lamp;           /**< whether the malfunction indicator of the module is on */
} velmora_code;
/** Gets a code. On the thread that called the function, before that returns. */
typedef void (*velmora_code_fn)(velmora_code const* code, void* user);
/**
 * Tells each trouble code of each list of each control module, and of each list without codes that it has none. Waits
 * for the car. Any thread, but no callback of a watch or of the progress.
 */
VELMORA_API int velmora_car_codes(velmora_car* car, velmora_code_fn fn, void* user, velmora_error** error);

/** What a control module said when it was asked to clear its codes. */
enum
{
    VELMORA_CLEARED = 0,         /**< it has cleared them */
    VELMORA_CLEAR_REFUSED = 1,   /**< by a negative reply */
    VELMORA_CLEAR_NO_ANSWER = 2, /**< it may have cleared them all the same */
    VELMORA_CLEAR_UNREADABLE = 3 /**< it answered in a form that can't be decoded */
};

/** That one control module has cleared its codes, or why not. */
typedef struct velmora_cleared
{
    size_t size;             /**< what the library has filled in, in bytes */
    char const* reason;      /**< of a refusal; else empty */
    char const* module_name; /**< such as "ECM" */
    uint32_t module;         /**< id of the control module, such as 0x7E8 */
    uint32_t result;         /**< VELMORA_CLEARED and so on */
} velmora_cleared;
/** Gets what a control module said. On the thread that called the function, before that returns. */
typedef void (*velmora_cleared_fn)(velmora_cleared const* module, void* user);

/** That the caller knows what is erased: without it velmora_car_clear does nothing. */
#define VELMORA_CLEAR_ERASES_READINESS 0x1u

/**
 * Clears the confirmed and pending codes of all control modules and turns the lamp off. Also erases freeze frames,
 * readiness, test results, and the distance and time since the last clearing: the vehicle must be driven before it can
 * pass an emissions test. `flags` is VELMORA_CLEAR_ERASES_READINESS. `fn` is told of each module; the function fails if
 * none cleared its codes. Waits for the car. Any thread, but no callback of a watch or of the progress.
 */
VELMORA_API int velmora_car_clear(velmora_car* car, uint32_t flags, velmora_cleared_fn fn, void* user,
                                  velmora_error** error);

/** How often a monitor could run and did, or that a control module tells of none. */
typedef struct velmora_counter
{
    size_t size;             /**< what the library has filled in, in bytes */
    char const* name;        /**< NULL if the module told of no counter that is not 0 */
    char const* module_name; /**< such as "ECM" */
    uint32_t module;         /**< id of the control module, such as 0x7E8 */
    uint32_t answer;         /**< VELMORA_ANSWER_... */
    uint32_t value;          /**< how often */
    uint32_t unused;         /**< 0 */
} velmora_counter;
/** Gets a counter. On the thread that called the function, before that returns. */
typedef void (*velmora_counter_fn)(velmora_counter const* counter, void* user);
/**
 * Tells the in-use counters of each control module that are not 0, each module at least once. Waits for the car. Any
 * thread, but no callback of a watch or of the progress.
 */
VELMORA_API int velmora_car_counters(velmora_car* car, velmora_counter_fn fn, void* user, velmora_error** error);

/** How far an on-board monitor has come. */
enum
{
    VELMORA_MONITOR_COMPLETE = 0,      /**< it has run */
    VELMORA_MONITOR_NOT_COMPLETE = 1,  /**< it has still to run */
    VELMORA_MONITOR_DISABLED = 2,      /**< for the rest of this driving cycle */
    VELMORA_MONITOR_NOT_AVAILABLE = 3, /**< the vehicle has no such monitor */
    VELMORA_MONITOR_UNTOLD = 4         /**< the module does not tell it */
};

/** A monitor of the emission system, or that a control module tells of none. */
typedef struct velmora_readiness
{
    size_t size;             /**< what the library has filled in, in bytes */
    char const* name;        /**< "Misfire"; NULL if the module told of no monitor */
    char const* module_name; /**< such as "ECM" */
    uint32_t module;         /**< id of the control module, such as 0x7E8 */
    uint32_t answer;         /**< VELMORA_ANSWER_... */
    uint32_t lamp;           /**< whether the malfunction indicator is on */
    uint32_t since_cleared;  /**< VELMORA_MONITOR_..., since the codes were cleared */
    uint32_t this_cycle;     /**< VELMORA_MONITOR_..., in this driving cycle */
    uint32_t unused;         /**< 0 */
} velmora_readiness;
/** Gets a monitor. On the thread that called the function, before that returns. */
typedef void (*velmora_readiness_fn)(velmora_readiness const* monitor, void* user);
/**
 * Tells the readiness monitors of each control module, each module at least once. Waits for the car. Any thread, but no
 * callback of a watch or of the progress.
 */
VELMORA_API int velmora_car_readiness(velmora_car* car, velmora_readiness_fn fn, void* user, velmora_error** error);

/** How a test that a control module made on itself has ended. */
enum
{
    VELMORA_TEST_FAILED = 0,    /**< outside its limits */
    VELMORA_TEST_PASSED = 1,    /**< within its limits */
    VELMORA_TEST_NO_RESULT = 2, /**< not run since the codes were cleared */
    VELMORA_TEST_NO_LIMITS = 3  /**< a constant, with nothing to judge it by */
};

/** A test of an on-board monitor, or that a control module tells of none. */
typedef struct velmora_test
{
    size_t size;             /**< what the library has filled in, in bytes */
    char const* monitor;     /**< NULL if the module told of no test */
    char const* description; /**< of the test */
    char const* value;       /**< the result, without its unit */
    char const* minimum;     /**< empty for none */
    char const* maximum;     /**< empty for none */
    char const* unit;        /**< empty for none */
    char const* module_name; /**< such as "ECM" */
    uint32_t module;         /**< id of the control module, such as 0x7E8 */
    uint32_t answer;         /**< VELMORA_ANSWER_... */
    uint32_t monitor_id;     /**< monitor identifier of service 06 */
    uint32_t test_id;        /**< test identifier of service 06 */
    uint32_t verdict;        /**< VELMORA_TEST_... */
    uint32_t unused;         /**< 0 */
} velmora_test;
/** Gets a test. On the thread that called the function, before that returns. */
typedef void (*velmora_test_fn)(velmora_test const* test, void* user);
/**
 * Tells the results of on-board tests (service 06 on CAN), each control module at least once. Waits for the car. Any
 * thread, but no callback of a watch or of the progress.
 */
VELMORA_API int velmora_car_monitors(velmora_car* car, velmora_test_fn fn, void* user, velmora_error** error);

/** One thing that a control module tells of itself or of the vehicle. */
typedef struct velmora_info
{
    size_t size;       /**< what the library has filled in, in bytes */
    char const* key;   /**< "vin", "description", "standard", "protocol", "calibration", "verification" (the checksum of
                          the calibration before it), "engine_serial_number", "type_approval", "distance_with_lamp",
                          "time_with_lamp", "distance_since_cleared", "time_since_cleared" */
    char const* value; /**< as people write it, without its unit */
    char const* unit;  /**< empty for none */
    char const* module_name; /**< such as "ECM" */
    uint32_t module;         /**< id of the control module, such as 0x7E8 */
    uint32_t unused;         /**< 0 */
} velmora_info;
/** Gets one thing. On the thread that called the function, before that returns. */
typedef void (*velmora_info_fn)(velmora_info const* info, void* user);
/**
 * Tells what each control module says of itself and the vehicle; what was not told is left out. Waits for the car. Any
 * thread, but no callback of a watch or of the progress.
 */
VELMORA_API int velmora_car_info(velmora_car* car, velmora_info_fn fn, void* user, velmora_error** error);

/**
 * All that the vehicle tells, as the JSON document that docs/json.md describes. `*json` belongs to the caller. Takes
 * seconds. Waits for the car. Any thread, but no callback of a watch or of the progress.
 */
VELMORA_API int velmora_car_report_json(velmora_car* car, char** json, velmora_error** error);

/** One meaning of a trouble code. */
typedef struct velmora_meaning
{
    size_t size;        /**< what the library has filled in, in bytes */
    char const* code;   /**< "P0420" */
    char const* maker;  /**< "Generic", a maker, or "Unknown" */
    char const* text;   /**< what that maker means by the code */
    char const* system; /**< "Powertrain", "Body", "Chassis", "Network" or "Undefined" */
} velmora_meaning;
/** Gets a meaning. On the thread that called velmora_catalogue_find, before that returns. */
typedef void (*velmora_meaning_fn)(velmora_meaning const* meaning, void* user);
/**
 * Tells all meanings of a trouble code, with or without a car: the generic one first. VELMORA_WRONG_USE for what is no
 * trouble code. Any thread, a callback too.
 */
VELMORA_API int velmora_catalogue_find(char const* code, velmora_meaning_fn fn, void* user, velmora_error** error);

/** @} */

#ifdef __cplusplus
}
#endif

#endif
