/* Reads a car from C: car PORT [CODE], such as car sim:petrol-can11 P0420 */

#include <velmora/velmora.h>

#include <inttypes.h>
#include <stdio.h>

static void print_module(velmora_module const* module, void* user)
{
    (void)user;
    printf("%" PRIX32 " %s\n", module->id, module->name);
}

static void print_reading(velmora_reading const* reading, void* user)
{
    (void)user;
    printf("%s: %s %s\n", reading->name, reading->text, reading->unit);
}

static void print_code(velmora_code const* code, void* user)
{
    (void)user;
    if (code->code != NULL) {
        printf("%" PRIX32 " %s %s\n", code->module, code->code, code->text);
    } else if (code->answer != VELMORA_ANSWER_READ) {
        printf("%" PRIX32 " did not tell all of its codes\n", code->module);
    }
}

static void print_meaning(velmora_meaning const* meaning, void* user)
{
    (void)user;
    printf("%s %s: %s\n", meaning->code, meaning->maker, meaning->text);
}

static int print_error(velmora_error* error)
{
    int const code = velmora_error_code(error);
    size_t hint;
    fprintf(stderr, "%s\n", velmora_error_message(error));
    for (hint = 0; hint < velmora_error_hint_count(error); ++hint) {
        fprintf(stderr, "  - %s\n", velmora_error_hint(error, hint));
    }
    velmora_error_free(error);
    return code;
}

int main(int count, char** arguments)
{
    char const* const sensors[] = {"RPM", "coolant"};
    velmora_options options = VELMORA_OPTIONS_INIT;
    velmora_car* car = NULL;
    velmora_error* error = NULL;
    int code;

    if (velmora_abi_version() != VELMORA_ABI_VERSION) {
        fprintf(stderr, "the library is not the one that this program was compiled for\n");
        return 1;
    }
    code = velmora_car_open(count > 1 ? arguments[1] : "auto", &options, &car, &error);
    if (code == VELMORA_OK) {
        code = velmora_car_modules(car, print_module, NULL, &error);
    }
    if (code == VELMORA_OK) {
        code = velmora_car_read(car, sensors, 2, print_reading, NULL, &error);
    }
    if (code == VELMORA_OK) {
        code = velmora_car_codes(car, print_code, NULL, &error);
    }
    velmora_car_close(car);
    if (code == VELMORA_OK && count > 2) {
        code = velmora_catalogue_find(arguments[2], print_meaning, NULL, &error);
    }
    return code == VELMORA_OK ? 0 : print_error(error);
}
