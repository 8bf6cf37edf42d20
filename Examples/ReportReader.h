/*
 * Finds the input reports in the text of a recording (Docs/RecordingFormat.md) of any version, however its
 * JSON is laid out. It scans for members and checks nothing: `zorvatouch info FILE` says whether a recording
 * is valid.
 */
#ifndef REPORT_READER_H
#define REPORT_READER_H

#include <ctype.h>
#include <stdint.h>
#include <stdlib.h>
#include <string.h>

typedef struct ReportReader {
    const char *position; /* in the text, which is the caller's */
    int depth;            /* objects and arrays around it */
    const char *member;   /* name of the last member, after the quote */
    int version;          /* of the container */
    int isInFrames;       /* whether the container's member is the one with the frames */
} ReportReader;

/* The next character of a JSON string, its escape resolved if it is ASCII; 0 at the end. */
static int nextCharacter(const char **string) {
    static const char escapes[] = "b\bf\fn\nr\rt\t";
    const char *text = *string;
    if (*text == '\0' || *text == '"')
        return 0;
    if (*text != '\\' || text[1] == '\0') {
        *string = text + 1;
        return (unsigned char)*text;
    }
    if (text[1] != 'u') {
        const char *escape = strchr(escapes, text[1]);
        *string = text + 2;
        return escape ? escape[1] : text[1];
    }
    char digits[5] = "";
    for (size_t index = 0; index < 4 && isxdigit((unsigned char)text[2 + index]); ++index)
        digits[index] = text[2 + index];
    *string = text + 2 + strlen(digits);
    const int code = (int)strtoul(digits, NULL, 16);
    return code > 0 && code < 0x80 ? code : '?';
}

static int isText(const char *string, const char *expected) {
    while (*expected)
        if (nextCharacter(&string) != *expected++)
            return 0;
    return nextCharacter(&string) == 0;
}

enum { kScannedAll, kScannedMember, kScannedObject };

/* Advances to the value of the next member, or over the end of an object. */
static int scan(ReportReader *reader) {
    static const char space[] = " \t\r\n";
    while (*reader->position) {
        const char character = *reader->position++;
        reader->depth += (character == '{' || character == '[') - (character == '}' || character == ']');
        if (character == '}')
            return kScannedObject;
        if (character != '"')
            continue;
        reader->member = reader->position;
        while (nextCharacter(&reader->position))
            ;
        reader->position += *reader->position == '"';
        reader->position += strspn(reader->position, space);
        if (*reader->position != ':')
            continue;
        ++reader->position;
        reader->position += strspn(reader->position, space);
        return kScannedMember;
    }
    return kScannedAll;
}

/* Begins to read. Returns 0 if the text is not a recording of a known version. */
static int openReports(ReportReader *reader, const char *text) {
    double version = -1;
    ReportReader scanner = {text, 0, NULL, 0, 0};
    for (int found; (found = scan(&scanner)) != kScannedAll;)
        if (found == kScannedMember && scanner.depth == 1 && isText(scanner.member, "Version"))
            version = strtod(scanner.position, NULL);
    *reader = (ReportReader){text, 0, NULL, (int)version, 0};
    return version == 0 || version == 1 || version == 2;
}

/* Bytes as hexadecimal numbers with white space between them. Returns how many were stored. */
static size_t readBytes(const char *string, uint8_t *bytes, size_t size) {
    size_t length = 0;
    for (int character = ' '; character != 0 && length < size;) {
        char token[32], *end = token;
        size_t used = 0;
        while ((character = nextCharacter(&string)) > ' ')
            if (used < sizeof token - 1)
                token[used++] = (char)character;
        token[used] = '\0';
        const unsigned long byte = strtoul(token, &end, 16);
        if (*end != '\0' || byte > 0xFF)
            break;
        if (used > 0)
            bytes[length++] = (uint8_t)byte;
    }
    return length;
}

/* Stores the next report, as much of it as fits, and returns 1; 0 at the end. */
static int readReport(ReportReader *reader, uint8_t *bytes, size_t size, size_t *length) {
    static const char *const lists[] = {"Reports", "Frames", "Frames"};
    static const char *const members[] = {"ReportData", "Report", "Data"};
    const char *type = NULL, *data = NULL;
    for (int found; (found = scan(reader)) != kScannedAll;) {
        if (found == kScannedMember && reader->depth == 1)
            reader->isInFrames = isText(reader->member, lists[reader->version]);
        if (found == kScannedMember && reader->depth == 3 && reader->isInFrames && *reader->position == '"') {
            if (isText(reader->member, "Type"))
                type = reader->position + 1;
            if (isText(reader->member, members[reader->version]))
                data = reader->position + 1;
        }
        if (found != kScannedObject || reader->depth != 2)
            continue;
        if (data && (reader->version == 0 || (type && isText(type, "InputReport")))) {
            *length = readBytes(data, bytes, size);
            return 1;
        }
        type = data = NULL;
    }
    return 0;
}

#endif /* REPORT_READER_H */
