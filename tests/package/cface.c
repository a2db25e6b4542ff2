/* Holds the C face against its promises, with a simulated car: cface */

#include <velmora/velmora.h>

#include <math.h>
#include <pthread.h>
#include <stdio.h>
#include <stdlib.h>
#include <string.h>

static int failures = 0;

#define CHECK(condition)                                                                                               \
    ((condition) ? (void)0 : (void)(printf("line %d: not so: %s\n", __LINE__, #condition), ++failures))

static char const* const port = "sim:petrol-can11?instant";

struct seen
{
    velmora_car* car;
    velmora_watch* watch;
    pthread_mutex_t mutex;
    pthread_cond_t wake;
    int count;
    int with_value;
    int refused_read;
    int refused_close;
    int stop_inside;
    char last[64];
};

static void note_text(struct seen* seen, char const* text)
{
    ++seen->count;
    strncpy(seen->last, text, sizeof(seen->last) - 1);
}

static void on_module(velmora_module const* module, void* user)
{
    CHECK(module->size == sizeof(velmora_module) && module->id != 0);
    note_text(user, module->name);
}

static void on_sensor(velmora_sensor const* sensor, void* user)
{
    CHECK(sensor->size == sizeof(velmora_sensor) && sensor->title[0] != 0 && sensor->key[0] != 0);
    note_text(user, sensor->pid);
}

static void on_code(velmora_code const* code, void* user)
{
    struct seen* const seen = user;
    CHECK(code->size == sizeof(velmora_code) && (code->code == NULL) == (code->text == NULL));
    CHECK(code->lamp == VELMORA_YES || code->lamp == VELMORA_NO);
    if (code->code != NULL && strcmp(code->code, "P0171") == 0) {
        CHECK(code->kind == VELMORA_CODE_CONFIRMED && code->answer == VELMORA_ANSWER_READ && code->module == 0x7E8);
        CHECK(strstr(code->text, "Lean") != NULL);
        ++seen->with_value;
    }
    ++seen->count;
}

static void on_monitor(velmora_readiness const* monitor, void* user)
{
    struct seen* const seen = user;
    CHECK(monitor->size == sizeof(velmora_readiness));
    CHECK((monitor->name != NULL) == (monitor->answer == VELMORA_ANSWER_READ));
    seen->with_value += monitor->name != NULL && monitor->since_cleared == VELMORA_MONITOR_COMPLETE;
    ++seen->count;
}

static void on_counter(velmora_counter const* counter, void* user)
{
    struct seen* const seen = user;
    CHECK(counter->size == sizeof(velmora_counter) && (counter->name == NULL || counter->value > 0));
    seen->with_value += counter->name != NULL;
    ++seen->count;
}

static void on_cleared(velmora_cleared const* module, void* user)
{
    struct seen* const seen = user;
    CHECK(module->size == sizeof(velmora_cleared) && module->reason != NULL);
    seen->with_value += module->result == VELMORA_CLEARED;
    ++seen->count;
}

static void on_test(velmora_test const* test, void* user)
{
    struct seen* const seen = user;
    CHECK(test->size == sizeof(velmora_test));
    seen->with_value += test->monitor != NULL && test->verdict == VELMORA_TEST_PASSED && test->value[0] != 0;
    ++seen->count;
}

static void on_info(velmora_info const* info, void* user)
{
    CHECK(info->size == sizeof(velmora_info) && info->value[0] != 0);
    if (strcmp(info->key, "vin") == 0) {
        note_text(user, info->value);
    }
}

static void on_meaning(velmora_meaning const* meaning, void* user)
{
    CHECK(strcmp(meaning->code, "P0420") == 0);
    if (strcmp(meaning->maker, "Generic") == 0) {
        note_text(user, meaning->text);
    }
}

static void on_reading(velmora_reading const* reading, void* user)
{
    struct seen* const seen = user;
    CHECK(reading->size == sizeof(velmora_reading));
    CHECK((reading->value == VELMORA_VALUE_NUMBER) == !isnan(reading->number));
    if (strcmp(reading->sensor, "RPM") == 0) {
        CHECK(reading->raw_size == 4 && reading->raw[0] == 0x41 && reading->raw[1] == 0x0C);
        CHECK(strcmp(reading->unit, "rpm") == 0 && strcmp(reading->pid, "010C") == 0);
        CHECK(reading->number > 0 && reading->number < 16384);
    }
    pthread_mutex_lock(&seen->mutex);
    ++seen->count;
    seen->with_value += reading->value != VELMORA_VALUE_NONE;
    pthread_cond_signal(&seen->wake);
    pthread_mutex_unlock(&seen->mutex);
}

/* On the car's thread: what would wait for that thread is refused, and a watch may stop itself. */
static void on_watched(velmora_reading const* reading, void* user)
{
    struct seen* const seen = user;
    char const* const names[] = {"RPM"};
    (void)reading;
    pthread_mutex_lock(&seen->mutex);
    seen->refused_read = velmora_car_read(seen->car, names, 1, on_reading, seen, NULL);
    seen->refused_close = velmora_car_close(seen->car);
    ++seen->count;
    if (seen->stop_inside && seen->watch != NULL) {
        velmora_watch_stop(seen->watch);
        seen->watch = NULL;
    }
    pthread_cond_signal(&seen->wake);
    pthread_mutex_unlock(&seen->mutex);
}

static void wait_for(struct seen* seen, int count)
{
    while (seen->count < count) {
        pthread_cond_wait(&seen->wake, &seen->mutex);
    }
}

static void check_errors(void)
{
    velmora_error* error = NULL;
    velmora_car* car = (velmora_car*)&error;
    velmora_options options = VELMORA_OPTIONS_INIT;

    CHECK(velmora_abi_version() == VELMORA_ABI_VERSION && strlen(velmora_version()) >= 5);
    CHECK(velmora_car_open("sim:no-such-car", NULL, &car, &error) == VELMORA_PORT_FAILED && car == NULL);
    CHECK(velmora_error_code(error) == VELMORA_PORT_FAILED && strlen(velmora_error_message(error)) > 10);
    CHECK(velmora_error_hint(error, velmora_error_hint_count(error)) == NULL);
    velmora_error_free(error);

    CHECK(velmora_car_open("127.0.0.1:1", NULL, &car, &error) == VELMORA_PORT_FAILED);
    CHECK(velmora_error_hint_count(error) > 0 && velmora_error_hint(error, 0)[0] != 0);
    velmora_error_free(error);

    CHECK(velmora_car_open(NULL, NULL, &car, NULL) == VELMORA_WRONG_USE);
    CHECK(velmora_car_open(port, NULL, NULL, NULL) == VELMORA_WRONG_USE);
    options.size = 0;
    CHECK(velmora_car_open(port, &options, &car, NULL) == VELMORA_WRONG_USE);
    CHECK(velmora_car_read(NULL, NULL, 0, on_reading, NULL, NULL) == VELMORA_WRONG_USE);
    CHECK(velmora_catalogue_find("no code", on_meaning, NULL, NULL) == VELMORA_WRONG_USE);

    CHECK(velmora_error_code(NULL) == VELMORA_OK && velmora_error_message(NULL)[0] == 0);
    velmora_error_free(NULL);
    velmora_free(NULL);
    velmora_watch_stop(NULL);
    CHECK(velmora_car_close(NULL) == VELMORA_OK);
}

static void on_progress(char const* text, void* user)
{
    CHECK(text[0] != 0);
    ++*(int*)user;
}

static void check_topics(velmora_car* car)
{
    struct seen seen = {0};
    char* json = NULL;

    CHECK(velmora_car_modules(car, on_module, &seen, NULL) == VELMORA_OK && seen.count == 2);
    memset(&seen, 0, sizeof(seen));
    CHECK(velmora_car_sensors(car, on_sensor, &seen, NULL) == VELMORA_OK && seen.count > 20);
    memset(&seen, 0, sizeof(seen));
    CHECK(velmora_car_codes(car, on_code, &seen, NULL) == VELMORA_OK && seen.count >= 6 && seen.with_value == 1);
    memset(&seen, 0, sizeof(seen));
    CHECK(velmora_car_readiness(car, on_monitor, &seen, NULL) == VELMORA_OK && seen.with_value > 3);
    memset(&seen, 0, sizeof(seen));
    CHECK(velmora_car_monitors(car, on_test, &seen, NULL) == VELMORA_OK && seen.with_value > 3);
    memset(&seen, 0, sizeof(seen));
    CHECK(velmora_car_counters(car, on_counter, &seen, NULL) == VELMORA_OK && seen.with_value > 0);
    memset(&seen, 0, sizeof(seen));
    CHECK(velmora_car_info(car, on_info, &seen, NULL) == VELMORA_OK && strlen(seen.last) == 17);
    memset(&seen, 0, sizeof(seen));
    CHECK(velmora_catalogue_find("p0420", on_meaning, &seen, NULL) == VELMORA_OK &&
          strstr(seen.last, "Catalyst") != NULL);
    CHECK(velmora_car_report_json(car, &json, NULL) == VELMORA_OK && json[0] == '{' && strstr(json, "P0171") != NULL);
    velmora_free(json);
}

static void check_readings(velmora_car* car)
{
    struct seen seen = {0};
    char const* const names[] = {"RPM", "coolant", "7E9:05"};
    char const* const wrong[] = {"no such sensor"};
    char const* const other[] = {"AMBIANT_AIR_TEMP"}; /* as other programs name it */
    velmora_error* error = NULL;

    pthread_mutex_init(&seen.mutex, NULL);
    pthread_cond_init(&seen.wake, NULL);
    seen.car = car;
    CHECK(velmora_car_read(car, names, 2, on_reading, &seen, &error) == VELMORA_OK && error == NULL);
    CHECK(seen.count == 2 && seen.with_value == 2);
    CHECK(velmora_car_read(car, wrong, 1, on_reading, &seen, NULL) == VELMORA_WRONG_USE && seen.count == 2);
    CHECK(velmora_car_read(car, other, 1, on_reading, &seen, NULL) == VELMORA_OK && seen.with_value == 3);

    for (seen.stop_inside = 0; seen.stop_inside < 2; ++seen.stop_inside) {
        velmora_watch* watch = NULL;
        seen.count = 0;
        seen.watch = NULL;
        CHECK(velmora_car_watch(car, names, 1, on_watched, NULL, &seen, &watch, NULL) == VELMORA_OK && watch != NULL);
        pthread_mutex_lock(&seen.mutex);
        wait_for(&seen, 3);
        seen.watch = watch;
        wait_for(&seen, seen.count + 1);
        CHECK((seen.watch == NULL) == (seen.stop_inside == 1));
        watch = seen.watch;
        pthread_mutex_unlock(&seen.mutex);
        velmora_watch_stop(watch);
        CHECK(seen.refused_read == VELMORA_WRONG_USE && seen.refused_close == VELMORA_WRONG_USE);
    }
    pthread_cond_destroy(&seen.wake);
    pthread_mutex_destroy(&seen.mutex);
}

/* Clearing needs its flag, and clears. */
static void check_clearing(velmora_car* car)
{
    struct seen seen = {0};
    velmora_error* error = NULL;

    CHECK(velmora_car_clear(car, 0, on_cleared, &seen, &error) == VELMORA_WRONG_USE && seen.count == 0);
    CHECK(velmora_error_hint_count(error) == 1);
    velmora_error_free(error);
    CHECK(velmora_car_codes(car, on_code, &seen, NULL) == VELMORA_OK && seen.with_value == 1);
    memset(&seen, 0, sizeof(seen));
    CHECK(velmora_car_clear(car, VELMORA_CLEAR_ERASES_READINESS, on_cleared, &seen, NULL) == VELMORA_OK);
    CHECK(seen.with_value > 0);
}

int main(void)
{
    velmora_options options = VELMORA_OPTIONS_INIT;
    velmora_car* car = NULL;
    velmora_car* second = NULL;
    velmora_watch* left = NULL;
    struct seen seen = {0};
    int told = 0;

    check_errors();
    options.settings_file = "/proc/nonexistent/settings.toml";
    options.on_progress = on_progress;
    options.progress_user = &told;
    options.size = offsetof(velmora_options, reset); /* an older caller: what it does not know is not read */
    options.reset = 0xFFFFFFFFu;
    CHECK(velmora_car_open(port, &options, &car, NULL) == VELMORA_OK && car != NULL && told > 0);
    if (car == NULL) {
        return 1;
    }
    CHECK(velmora_car_open(port, &options, &second, NULL) == VELMORA_WRONG_USE && second == NULL);
    check_topics(car);
    check_readings(car);
    CHECK(velmora_car_reconnect(car, NULL) == VELMORA_OK);
    check_clearing(car);

    pthread_mutex_init(&seen.mutex, NULL);
    pthread_cond_init(&seen.wake, NULL);
    CHECK(velmora_car_watch(car, NULL, 0, on_reading, NULL, &seen, &left, NULL) == VELMORA_OK);
    CHECK(velmora_car_close(car) == VELMORA_OK);
    velmora_watch_stop(left); /* outlives its car */
    pthread_cond_destroy(&seen.wake);
    pthread_mutex_destroy(&seen.mutex);
    printf("%d checks failed\n", failures);
    return failures == 0 ? 0 : 1;
}
