/*
 * A host that knows the library by its documented files alone: it loads it at run time and shares no
 * code and no header with it. Run in the folder that TMPDIR names, with the library's path.
 */
#include <dlfcn.h>
#include <stdint.h>
#include <stdio.h>
#include <stdlib.h>
#include <string.h>
#include <unistd.h>

static int failures;

static void Expect(int truth, const char* what)
{
    if (!truth)
        fprintf(stderr, "failed: %s\n", what);
    failures += !truth;
}

static FILE* Open(const char* name, const char* mode)
{
    FILE* file = fopen(name, mode);
    if (file == NULL) {
        perror(name);
        exit(1);
    }
    return file;
}

static void Put_Word(FILE* file, uint32_t word)
{
    int i;
    for (i = 0; i < 4; ++i)
        fputc((int)(word >> 8 * i & 0xFF), file);
}

static void Put_Text(FILE* file, const char* text)
{
    Put_Word(file, 0);
    Put_Word(file, (uint32_t)strlen(text));
    fputs(text, file);
}

static void Write_Pass_File(const char* name, const char* input, const char* output)
{
    FILE* file = Open(name, "wb");
    Put_Word(file, 0);
    Put_Word(file, 0x40000000); /* the number 2.0 */
    Put_Text(file, input);
    Put_Text(file, output);
    fclose(file);
}

/* The head of a carrier file: words, and the id. */
static void Write_Carrier(const char* name)
{
    static const uint32_t words[16] = {1, 9, 9, 9, 9, 9, 1, 2, 3, 0, 1, 2, 9, 9, 0, 0x40BA2B80};
    FILE* file = Open(name, "wb"); /* the last two are the number 6699.5 */
    int i;
    for (i = 0; i < 16; ++i)
        Put_Word(file, words[i]);
    fclose(file);
}

/* Whether the file holds just these bytes. */
static int Holds(const char* name, const char* bytes, size_t size)
{
    char found[4096];
    FILE* file = fopen(name, "rb");
    const size_t length = file == NULL ? 0 : fread(found, 1, sizeof found, file);
    if (file != NULL)
        fclose(file);
    return file != NULL && length == size && memcmp(found, bytes, size) == 0;
}

static int Is_Absent(const char* name)
{
    return access(name, F_OK) != 0;
}

int main(int count, char** arguments)
{
    static const char crops[] = "plot,yield\n1,2.5\n";
    static const char wanted[] = "plot\tyield\r\n1\t2.5\r\n";
    static const char told[] = "Input file could not be opened.\nTrial files not supported.\n:\n";
    int32_t (*ingester)(const char*, const char*, int32_t, int32_t);
    char pass[64], result[64], messages[64];
    void* const library = count == 2 ? dlopen(arguments[1], RTLD_NOW | RTLD_LOCAL) : NULL;
    void* const symbol = library == NULL ? NULL : dlsym(library, "INGESTER");
    FILE* file = Open("crops.csv", "wb");
    fputs(crops, file);
    fclose(file);
    if (symbol == NULL) {
        fprintf(stderr, "usage: dlopen_host LIBRARY (%s)\n", count == 2 ? dlerror() : "one argument");
        return 2;
    }
    memcpy(&ingester, &symbol, sizeof ingester); /* C has no cast from an object to a function */
    snprintf(pass, sizeof pass, "IG%li.inp", (long)getpid());
    snprintf(result, sizeof result, "IG%li.out", (long)getpid());
    snprintf(messages, sizeof messages, "IG%li.ERR", (long)getpid());

    Write_Pass_File(pass, "absent.csv", "none.tab");
    Expect(ingester("", "", 0, 0) == 0, "a failed request returns 0");
    Expect(Holds(result, "\2\0\0\0\0\0\0\0", 8), "an absent input has status 2");
    Expect(Holds(messages, told, strlen(told)), "an absent input is told");
    Expect(Is_Absent("none.tab"), "a failed request leaves no output");

    Write_Pass_File(pass, "crops.csv", ".\\by_id.tab");
    Expect(ingester("", "other.out", 0, 9) == 0, "a request returns 0");
    Expect(Holds("other.out", "\0\0\0\0\0\0\0\0", 8), "a good one has status 0, in the file asked for");
    Expect(Holds("by_id.tab", wanted, strlen(wanted)), "a good request writes its output");
    Expect(Is_Absent(pass) && Is_Absent(messages), "the pass file goes, and earlier messages");

    Write_Carrier("carrier.bin");
    Write_Pass_File("IG1A2B.tmp", "crops.csv", "by_carrier.tab");
    Expect(ingester("carrier.bin", "", 11, 0) == 0, "a request by carrier returns 0");
    Expect(Holds("IG1A2B.out", "\0\0\0\0\0\0\0\0", 8), "a request by carrier has status 0");
    Expect(Holds("by_carrier.tab", wanted, strlen(wanted)), "a request by carrier writes its output");
    Expect(Is_Absent("IG1A2B.tmp"), "its pass file goes");
    dlclose(library);
    return failures == 0 ? 0 : 1;
}
