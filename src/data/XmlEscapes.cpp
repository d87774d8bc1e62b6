#include "data/XmlEscapes.h"

#include <cstring>

namespace xml {

void UndoEscapes(char* value)
{
    char* write = value;
    const char* read = value;
    while (*read != '\0') {
        if (*read != '\\') {
            *write++ = *read++;
            continue;
        }
        const char next = read[1];
        if (next == '\0')
            break;
        switch (next) {
        case 'n':
            *write++ = '\n';
            break;
        case 'r':
            *write++ = '\r';
            break;
        case 't':
            *write++ = '\t';
            break;
        case '"':
            *write++ = '"';
            break;
        case '\\':
            *write++ = '\\';
            break;
        default:
            break;
        }
        read += 2;
    }
    *write = '\0';
}

void ReplaceQuotAndAmp(char* value)
{
    char* read = std::strchr(value, '&');
    if (read == nullptr)
        return;
    char* write = read;
    for (;;) {
        // `read` is at a '&'.
        if (std::strncmp(read, "&quot;", 6) == 0) {
            *write++ = '"';
            read += 6;
        } else if (std::strncmp(read, "&amp;", 5) == 0) {
            *write++ = '&';
            read += 5;
        } else {
            *write++ = *read++;
        }
        char* next = std::strchr(read, '&');
        if (next == nullptr) {
            const size_t rest = std::strlen(read);
            std::memmove(write, read, rest + 1);
            return;
        }
        const size_t run = static_cast<size_t>(next - read);
        if (write != read)
            std::memmove(write, read, run);
        write += run;
        read = next;
    }
}

}  // namespace xml
