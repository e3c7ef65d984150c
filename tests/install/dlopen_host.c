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

typedef int32_t (*Export)(const char*, const char*, int32_t, int32_t);

static Export ingester;
static int failures;

static void Expect(int truth, const char* what)
{
    if (!truth) {
        fprintf(stderr, "failed: %s\n", what);
        ++failures;
    }
}

static void Put_Word(FILE* file, uint32_t word)
{
    int i;
    for (i = 0; i < 4; ++i)
        fputc((int)(word >> 8 * i & 0xFF), file);
}

static void Put_Real(FILE* file, double value)
{
    uint64_t bits;
    memcpy(&bits, &value, sizeof bits);
    Put_Word(file, (uint32_t)bits);
    Put_Word(file, (uint32_t)(bits >> 32));
}

static void Put_Text(FILE* file, const char* text)
{
    Put_Word(file, 0);
    Put_Word(file, (uint32_t)strlen(text));
    fputs(text, file);
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

static void Write_File(const char* name, const char* text)
{
    FILE* file = Open(name, "wb");
    fputs(text, file);
    fclose(file);
}

static void Write_Pass_File(const char* name, double count, const char* input, const char* output)
{
    FILE* file = Open(name, "wb");
    Put_Real(file, count);
    Put_Text(file, input);
    Put_Text(file, output);
    fclose(file);
}

/* The head of a carrier file: words, of which `values` tells those that are looked at, and the id. */
static void Write_Carrier(const char* name, double id)
{
    static const uint32_t values[14] = {1, 9, 9, 9, 9, 9, 1, 2, 3, 0, 1, 2, 9, 9};
    FILE* file = Open(name, "wb");
    int i;
    for (i = 0; i < 14; ++i)
        Put_Word(file, values[i]);
    Put_Real(file, id);
    fclose(file);
}

/* The file's text, up to 4095 characters; "(absent)" when there is none. */
static const char* Text_Of(const char* name)
{
    static char text[4096];
    FILE* file = fopen(name, "rb");
    size_t length;
    if (file == NULL)
        return "(absent)";
    length = fread(text, 1, sizeof text - 1, file);
    text[length] = '\0';
    fclose(file);
    return text;
}

static int Is_Absent(const char* name)
{
    return access(name, F_OK) != 0;
}

/* The status in a result file, which goes; -1 when it is not as documented. */
static int Take_Status(const char* name)
{
    unsigned char bytes[9];
    FILE* file = fopen(name, "rb");
    size_t length;
    if (file == NULL)
        return -1;
    length = fread(bytes, 1, sizeof bytes, file);
    fclose(file);
    remove(name);
    if (length != 8 || bytes[1] != 0 || bytes[2] != 0 || bytes[3] != 0
        || memcmp(bytes + 4, "\0\0\0\0", 4) != 0)
        return -1;
    return bytes[0];
}

static int Ends_With(const char* text, const char* end)
{
    const size_t length = strlen(text);
    return length >= strlen(end) && strcmp(text + length - strlen(end), end) == 0;
}

/* One request by the process's number after the other, in one process. */
static void Test_Process_Id(void)
{
    static const char wanted[] = "plot\tyield\r\n1\t2.5\r\n";
    char pass[64], result[64], messages[64];
    const long id = (long)getpid();
    snprintf(pass, sizeof pass, "IG%li.inp", id);
    snprintf(result, sizeof result, "IG%li.out", id);
    snprintf(messages, sizeof messages, "IG%li.ERR", id);

    Write_Pass_File(pass, 2, "absent.csv", "none.tab");
    Expect(ingester("", "", 0, 0) == 0, "a failed request returns 0");
    Expect(Take_Status(result) == 2, "an absent input has status 2");
    Expect(strstr(Text_Of(messages), "Input file could not be opened.\n") != NULL, "an absent input is told");
    Expect(Ends_With(Text_Of(messages), "\n:\n"), "messages are closed by their mark");
    Expect(Is_Absent("none.tab"), "a failed request leaves no output");

    Write_Pass_File(pass, 2, "crops.csv", ".\\by_id.tab");
    Expect(ingester("", "", 0, 0) == 0, "a request returns 0");
    Expect(Take_Status(result) == 0, "a good request has status 0");
    Expect(strcmp(Text_Of("by_id.tab"), wanted) == 0, "a good request writes its output");
    Expect(Is_Absent(pass), "the pass file goes");
    Expect(Is_Absent(messages), "messages of an earlier request go");

    Write_Pass_File(pass, 7, "crops.csv", "none.tab");
    ingester("", "other.out", 0, 9);
    Expect(Take_Status("other.out") == 1, "a faulty pass file has status 1, in the result file asked for");
    Expect(Is_Absent(result), "the result file asked for is the only one");
    Expect(strcmp(Text_Of(messages), "Incorrect number of arguments.\n:\n") == 0, "its fault is told");
    remove(pass);
}

static void Test_Carrier(void)
{
    Write_Carrier("carrier.bin", 6699.5);
    Write_Pass_File("IG1A2B.tmp", 2, "crops.csv", "by_carrier.tab");
    Expect(ingester("carrier.bin", "", 11, 0) == 0, "a request by carrier returns 0");
    Expect(Take_Status("IG1A2B.out") == 0, "a request by carrier has status 0");
    Expect(!Is_Absent("by_carrier.tab"), "a request by carrier writes its output");
    Expect(Is_Absent("IG1A2B.tmp"), "its pass file goes");

    Write_Pass_File("IG1A2B.tmp", 2, "absent.csv", "none.tab");
    ingester("carrier.bin", "", 11, 0);
    Expect(Take_Status("IG1A2B.out") == 2, "a failed request by carrier has its status");
    Expect(Ends_With(Text_Of("IG1A2B.ERR"), "\n:\n"), "a failed request by carrier has its messages");
}

int main(int count, char** arguments)
{
    void* const library = count == 2 ? dlopen(arguments[1], RTLD_NOW | RTLD_LOCAL) : NULL;
    void* const symbol = library == NULL ? NULL : dlsym(library, "INGESTER");
    if (symbol == NULL) {
        fprintf(stderr, "usage: dlopen_host LIBRARY (%s)\n", count == 2 ? dlerror() : "one argument");
        return 2;
    }
    memcpy(&ingester, &symbol, sizeof ingester); /* C has no cast from an object to a function */
    Write_File("crops.csv", "plot,yield\n1,2.5\n");
    Test_Process_Id();
    Test_Carrier();
    dlclose(library);
    return failures == 0 ? 0 : 1;
}
