/*
 * limit.c: the least that a compiler of this language has to do, as a bare loop: it reads lines, looks names up, and
 * writes records with their numbers and texts. It checks nothing, knows no types, and its output is no database.
 *
 *     limit SOURCE OUTPUT
 */
#define _DEFAULT_SOURCE
#include <fcntl.h>
#include <stdint.h>
#include <stdio.h>
#include <stdlib.h>
#include <string.h>
#include <unistd.h>

enum { BUFFER = 65536, SLOTS = 256, FIELDS = 32 };

static const char *const names[] = {
    "Name",
    "Description",
    "DisplayName",
    "Id",
    "DataType",
    "VariableType",
    "VarietyRange",
    "GroupID",
    "GroupName",
    "Properties",
    "Range",
    "InitialValue",
    "ValidValue",
    "ValueDisplayName",
    "DefaultValue",
    "FileVersion",
    "ClassPermTemplate",
    "ResourcePermTemplate",
    "ResourceManager",
    "FirstKey",
    "LastKey",
    "MessageCatalog",
    "DescriptiveMessageSet",
    "DynamicClassAttribute",
    "DynamicResourceAttribute",
    "PersistentClassAttribute",
    "PersistentResourceAttribute",
    "ControlDefinition",
    "ResourceClass",
    "ClassToManagerMapping",
};

/* A name's position by a hash of its length and three characters; names that share a slot follow each other. */
static struct slot {
    const char *name;
    size_t length;
    unsigned field;
} slots[SLOTS];

static unsigned slot_of(const char *name, size_t length) {
    unsigned key = (unsigned)length * 31 + (unsigned char)name[0] * 7 + (unsigned char)name[length / 2] * 13 +
                   (unsigned char)name[length - 1];
    return key % SLOTS;
}

static void enter_names(void) {
    for (unsigned i = 0; i < sizeof names / sizeof *names; ++i) {
        size_t length = strlen(names[i]);
        unsigned at = slot_of(names[i], length);
        while (slots[at].name != NULL)
            at = (at + 1) % SLOTS;
        slots[at] = (struct slot){names[i], length, i % FIELDS};
    }
}

static unsigned look_up(const char *name, size_t length) {
    if (length == 0)
        exit(1);
    for (unsigned at = slot_of(name, length);; at = (at + 1) % SLOTS) {
        if (slots[at].name == NULL)
            exit(1);
        if (slots[at].length == length && memcmp(slots[at].name, name, length) == 0)
            return slots[at].field;
    }
}

/* What grows: records, and the texts that they refer to. */
struct arena {
    char *bytes;
    size_t used;
    size_t size;
};

static char *reserve(struct arena *a, size_t n) {
    if (a->used + n > a->size) {
        a->size = a->size * 2 + n;
        a->bytes = realloc(a->bytes, a->size);
        if (a->bytes == NULL)
            exit(1);
    }
    char *reserved = a->bytes + a->used;
    a->used += n;
    return reserved;
}

static struct arena records, texts;
static uint32_t record[FIELDS]; /* the open one */
static uint32_t highest;        /* its fields in use */

static void close_record(void) {
    memcpy(reserve(&records, highest * sizeof *record), record, highest * sizeof *record);
    memset(record, 0, sizeof record);
    highest = 0;
}

/* Digits are a number; anything else is a text. */
static void take_value(unsigned field, const char *value, size_t length) {
    uint32_t number = 0;
    const char *p = value;
    for (; p < value + length && (unsigned)(*p - '0') <= 9; ++p)
        number = number * 10 + (unsigned)(*p - '0');
    if (p < value + length) {
        number = (uint32_t)texts.used;
        char *text = reserve(&texts, (length + 8) & ~(size_t)7);
        memcpy(text, value, length);
        text[length] = '\0';
    }
    record[field] = number;
    highest = highest > field ? highest : field + 1;
}

static void take_line(const char *line, size_t length) {
    if (length == 0)
        return;
    if (line[0] != '\t') {
        close_record();
        record[0] = look_up(line, length);
        highest = 1;
        return;
    }
    const char *equals = memchr(line, '=', length);
    if (equals == NULL)
        exit(1);
    unsigned field = look_up(line + 1, (size_t)(equals - line) - 1);
    take_value(field, equals + 1, (size_t)(line + length - equals) - 1);
}

static void write_all(int fd, const struct arena *a) {
    for (size_t at = 0; at < a->used;) {
        ssize_t n = write(fd, a->bytes + at, a->used - at);
        if (n <= 0)
            exit(1);
        at += (size_t)n;
    }
}

int main(int argc, char **argv) {
    static char buffer[BUFFER];
    int in = argc == 3 ? open(argv[1], O_RDONLY) : -1;
    if (in < 0)
        return 2;
    enter_names();
    size_t begun = 0;
    for (ssize_t n = 0; (n = read(in, buffer + begun, BUFFER - begun)) > 0;) {
        const char *line = buffer;
        const char *end = buffer + begun + n;
        for (const char *newline = NULL; (newline = memchr(line, '\n', (size_t)(end - line))) != NULL;
             line = newline + 1)
            take_line(line, (size_t)(newline - line));
        begun = (size_t)(end - line);
        memmove(buffer, line, begun);
    }
    close_record();
    int out = open(argv[2], O_WRONLY | O_CREAT | O_TRUNC, 0644);
    write_all(out, &records);
    write_all(out, &texts);
    return close(out) != 0;
}
