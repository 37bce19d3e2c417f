/* messages.h: the errors of a compilation, each with an id. One table holds their texts and explanations. */
#ifndef CDGEN_LANGUAGE_MESSAGES_H
#define CDGEN_LANGUAGE_MESSAGES_H

#include <cstdint>
#include <span>
#include <string_view>

/* In the order of the codes. */
enum message_id : std::uint8_t {
    /* Lines and stanzas */
    MSG_UNKNOWN_STANZA,
    MSG_NO_STANZA,
    MSG_NO_EQUALS,
    MSG_UNMATCHED_QUOTES,
    MSG_VALUE_TOO_LONG,
    MSG_UNKNOWN_ATTRIBUTE,
    MSG_NO_VALUE,
    MSG_OPTIONAL_TOO_EARLY,
    MSG_REPEATED_ATTRIBUTE,
    MSG_NO_SD_ATTRIBUTE,
    MSG_INCOMPLETE_STANZA,
    MSG_NO_CLASS_FOR_PATTR,
    MSG_NO_CLASS_FOR_PATTR_C,
    MSG_NO_CLASS_FOR_DATTR,
    MSG_NO_CLASS_FOR_ACTION,
    MSG_NO_CLASS_FOR_SD,
    MSG_NO_STRING_TABLE,
    MSG_SECOND_MAP,

    /* Values */
    MSG_INVALID_PROPERTY,
    MSG_INVALID_DATA_TYPE,
    MSG_INVALID_VARIABLE_TYPE,
    MSG_INVALID_VARIETY,
    MSG_TOO_MANY_VARIETIES,
    MSG_RANGE_NEEDS_TWO,
    MSG_INVALID_VALUE,
    MSG_NO_VALID_VALUE,
    MSG_SD_DEFAULT,
    MSG_INDEX_NOT_CONSECUTIVE,
    MSG_SD_IN_SD,
    MSG_ELEMENT_DEFAULT,
    MSG_SECOND_MANAGER,
    MSG_SBS_TYPE,
    MSG_NO_ELEMENT_DEFAULT,
    MSG_NO_ELEMENT_INITIAL,

    /* The end of the source */
    MSG_NO_CLASSES,
    MSG_NO_MAPS,
    MSG_NO_MANAGER,
    MSG_KEYS_REVERSED,
    MSG_TOO_MANY_VARIABLE_CLASSES,
    MSG_TOO_MANY_RECORDS,
    MSG_TABLE_TOO_LARGE,
    MSG_INVALID_OUTPUT_NAME,

    /* Files, memory, the command line */
    MSG_USAGE,
    MSG_USAGE_NO_OUTPUT,
    MSG_CANNOT_OPEN,
    MSG_CANNOT_READ,
    MSG_CANNOT_CREATE,
    MSG_CANNOT_MAP,
    MSG_OUT_OF_MEMORY,
    MSG_NO_MEMORY_FOR_TABLE,
    MSG_NO_MEMORY_TO_GROW,
    MSG_NO_MEMORY_FOR_NAME,

    /* Defects of the compiler, which no source causes */
    MSG_UNKNOWN_ATTRIBUTE_TYPE,
    MSG_OUTSIDE_TABLE,
    MSG_NO_SD_TABLE,
    MSG_NOT_AN_SD_TYPE,
    MSG_NULL_ARRAY,
    MSG_SD_NOT_COPIED,
    MSG_SD_ARRAY_NOT_COPIED,
    MSG_ONLY_SD_COPIED,
    MSG_COPY_FAILED,
    MSG_NO_DEFAULT,
    MSG_NO_INITIAL_VALUE,
    MSG_NO_LOWER_BOUND,
    MSG_NO_UPPER_BOUND,
    MSG_DEFAULT_NOT_COPIED,
    MSG_NO_CLASS_TABLES,
    MSG_NO_MANAGER_TABLES,
    MSG_NO_MAP_TABLES,
    MSG_NO_VARIABLE_CLASS_TABLES,
    MSG_IMAGE_TOO_SMALL,

    MESSAGE_COUNT,
    NO_MESSAGE = MESSAGE_COUNT /* the error has already been reported where it was found */
};

/* The part of a line that an error is marked at. */
enum class mark_kind { none, text, name, value, item /* the part of the value that the message names */ };

/* Who has to act on an error. */
enum class blame { source, program, surroundings };

/* Where a message's text goes. */
enum class text_place {
    FIRST,     /* in front of the details */
    AFTER_ITEM /* after the first detail, the item that the message is about */
};

struct message {
    message_id id;
    const char *code; /* permanent: a code never changes its meaning */
    const char *text; /* permanent too, misspellings included */
    text_place place;
    mark_kind mark;
    blame whose;
    const char *cause; /* sentences; `names of the language` are in backquotes */
    const char *cure;
};

/* All messages, in the order of their ids. */
extern const std::span<const message> message_rows;

/* id: not NO_MESSAGE */
const message &message_of(message_id id);

/* The message with a code such as "S101", or null. */
const message *find_message(std::string_view code);

#endif
