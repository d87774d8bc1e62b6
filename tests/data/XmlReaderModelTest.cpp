// A second, literal byte-by-byte model of the reader, written straight from the
// reader's rules, compared with the real one on random inputs built from the
// dialect's awkward pieces: blocks, the cursor after each block and every
// message must agree. Catches any drift of the optimised reader.
#include "data/XmlReader.h"
#include "host/HostServices.h"
#include <cstdarg>
#include <cstdio>
#include <cstring>
#include <gtest/gtest.h>
#include <iostream>
#include <random>
#include <string>
#include <vector>

namespace {

std::vector<std::string>* sink;
static void Rep(int32_t level, const char* f, ...)
{
    char buf[70000];
    va_list a;
    va_start(a, f);
    vsnprintf(buf, sizeof buf, f, a);
    va_end(a);
    sink->push_back(std::to_string(level) + ":" + buf);
}

struct Ref {
    std::string d;
    int32_t size;
    int32_t cursor;
    bool active = true;
    char tok[16384];
    const char* path = "t.xml";
    char* name;
    int count;
    char* names[512];
    char* values[512];
    bool closing;
    std::vector<std::string> reps;
    static constexpr int LIM = 16383;
    static bool W(unsigned char c) { return c == 9 || c == 10 || c == 13 || c == 32; }
    void Err(const char* reason, int ch)
    {
        int32_t from = cursor > 0 ? cursor - 1 : 0;
        std::string ex(d.c_str() + from);
        if (ex.size() >= 255)
            ex.resize(254);
        int line = 1;
        for (int i = 0; i < cursor; ++i)
            if (d[i] == '\n')
                ++line;
        cursor = size;
        active = false;
        int p = (signed char)ch;
        char buf[70000];
        snprintf(buf, sizeof buf,
                 "Parsing error (%s) around line %d in XML '%s'. Unexpected character '%c' (%x) at:\n'%s'",
                 reason, line, path, p, (unsigned)p, ex.c_str());
        reps.push_back(std::string("1:") + buf);
    }
    bool Skip(int i)
    {
        for (;; ++i) {
            cursor = i;
            if (d[i] == '-' && d[i + 1] == '-' && d[i + 2] == '>') {
                cursor = i + 3;
                return true;
            }
            if (d[i] == '<' && d[i + 1] == '!' && d[i + 2] == '-') {
                Err("New comment block start within a comment block.", '<');
                return false;
            }
            if (i + 3 >= size) {
                Err("Comment block not ended properly.", ' ');
                return false;
            }
        }
    }
    char* Token()
    {
        if (cursor >= size)
            return nullptr;
        int n = 0;
        bool inTag = false, inQ = false;
        for (;;) {
            int at = cursor;
            unsigned char c = d[cursor];
            cursor++;
            if (strncmp(&d[at], "![CDATA[", 8) == 0) {
                const char* close = strstr(&d[at], "]]>");
                if (!close) {
                    Err("'![CDATA[' does not end with ']]>' pattern.", ' ');
                    return nullptr;
                }
                int ci = close - d.c_str();
                d[ci] = 0;
                cursor = ci + 3;
                names[0] = (char*)"CDATA";
                return &d[at + 8];
            }
            if (inQ) {
                bool esc = n >= 1 && tok[n - 1] == '\\' && !(n >= 2 && tok[n - 2] == '\\');
                if (c == '"' && !esc) {
                    inQ = false;
                    unsigned char nx = d[cursor];
                    if (!(nx == '>' || nx == '?' || nx == '/' || W(nx))) {
                        Err("Unexpected character after value definition.", nx);
                        return nullptr;
                    }
                }
                if (n < LIM)
                    tok[n++] = c;
            } else if (c == '"') {
                if (n < LIM)
                    tok[n++] = c;
                inQ = true;
            } else if (!inTag) {
                if (c == '<') {
                    bool any = false;
                    for (int i = 0; i < n; ++i)
                        any |= !W(tok[i]);
                    if (any) {
                        tok[n] = 0;
                        cursor--;
                        return tok;
                    }
                    n = 0;
                    inTag = true;
                    tok[n++] = '<';
                } else if (c == '>') {
                    Err("not expecting '>'", '>');
                    return nullptr;
                } else {
                    if (n >= LIM) {
                        Err("buffer overrun", ' ');
                        return nullptr;
                    }
                    tok[n++] = c;
                }
            } else {
                if (c == 9 || c == 10 || c == 13)
                    c = ' ';
                char last = n > 0 ? tok[n - 1] : 0;
                if (c == ' ' && (n == 0 || last == ' ' || last == '<' || last == '=')) {
                } else {
                    bool ret = false;
                    if (n > 0 && last == '<') {
                        if (c == '<') {
                            Err("not expecting another '<'", '<');
                            return nullptr;
                        }
                        if (c == '>') {
                            Err("not expecting '<' yet", '>');
                            return nullptr;
                        }
                    } else if (c == '>' && n > 0) {
                        if (n >= 2 && tok[n - 2] == ' ' && last == '/') {
                            tok[n - 2] = '/';
                            tok[n - 1] = '>';
                            tok[n] = 0;
                            return tok;
                        }
                        if (last == ' ') {
                            tok[n - 1] = '>';
                            tok[n] = 0;
                            return tok;
                        }
                    }
                    if (n > 3 && memcmp(tok + n - 4, "<!--", 4) == 0) {
                        n -= 4;
                        if (!Skip(cursor - 2))
                            return nullptr;
                    } else {
                        if (c == '=' && last == ' ')
                            --n;
                        if (n < LIM)
                            tok[n++] = c;
                        if (c == '>') {
                            tok[n] = 0;
                            ret = true;
                        }
                    }
                    if (ret)
                        return tok;
                }
            }
            if (cursor >= size)
                return nullptr;
        }
    }
    static void Unescape(char* v)
    {
        char* w = v;
        const char* r = v;
        while (*r) {
            if (*r != '\\') {
                *w++ = *r++;
                continue;
            }
            char nx = r[1];
            if (!nx)
                break;
            if (nx == 'n')
                *w++ = '\n';
            else if (nx == 'r')
                *w++ = '\r';
            else if (nx == 't')
                *w++ = '\t';
            else if (nx == '"')
                *w++ = '"';
            else if (nx == '\\')
                *w++ = '\\';
            r += 2;
        }
        *w = 0;
    }
    static void Ent(char* v, const char* e, char b)
    {
        std::string s(v), out;
        size_t L = strlen(e);
        for (size_t i = 0; i < s.size();) {
            if (s.compare(i, L, e) == 0) {
                out += b;
                i += L;
            } else
                out += s[i++];
        }
        strcpy(v, out.c_str());
    }
    bool Block()
    {
        if (!active || cursor >= size)
            return false;
        names[0] = nullptr;
        char* t = Token();
        if (!t)
            return false;
        count = 0;
        name = nullptr;
        closing = false;
        bool cd = names[0] && strcmp(names[0], "CDATA") == 0;
        if (cd || t[0] != '<' || t[1] == '!') {
            count = 1;
            if (!cd)
                names[0] = (char*)"DATA";
            values[0] = t;
            return true;
        }
        char* p = t + 1;
        if (*p == '/') {
            closing = true;
            ++p;
        }
        name = p;
        while (*p && *p != ' ' && *p != '>')
            ++p;
        if (*p == '>') {
            if (p[-1] == '/') {
                closing = true;
                p[-1] = 0;
            } else
                *p = 0;
            return true;
        }
        if (!*p)
            return true;
        *p = 0;
        if (cursor >= size)
            return false;
        ++p;
        for (;;) {
            char* an = p;
            char* eq = strchr(p, '=');
            if (!eq) {
                Err("Reading next block (case #1)", 0);
                return false;
            }
            *eq = 0;
            for (char* k = an; *k; ++k) {
                unsigned char c = *k;
                bool ok = (isalpha(c) && c < 128) || c == '-' || c == '.' || c == ':' || c == '_' ||
                          (k != an && c >= '0' && c <= '9');
                if (!ok) {
                    Err("Reading next block (case #1)", 0);
                    return false;
                }
            }
            char* v = eq + 1;
            char* e = v;
            bool q = false;
            for (;; ++e) {
                char c = *e;
                if (!c)
                    break;
                if (c == '"') {
                    if (!(e[-1] == '\\' && e[-2] != '\\'))
                        q = !q;
                    continue;
                }
                if (!q) {
                    if (c == ' ')
                        break;
                    if (c == '>') {
                        if (e[-1] == '/')
                            --e;
                        break;
                    }
                }
            }
            if (*v != '"') {
                Err("Expecting \" character to start value definition (all values must be defined "
                    "name=\"value\" with quotes).",
                    (unsigned char)*v);
                Err("Reading next block (case #2)", 0);
                return false;
            }
            char eb = *e;
            if (eb == '/')
                closing = true;
            *e = 0;
            if (e[-1] == '"')
                e[-1] = 0;
            char* val = v + 1;
            Unescape(val);
            Ent(val, "&quot;", '"');
            Ent(val, "&amp;", '&');
            if (count < 512) {
                names[count] = an;
                values[count] = val;
                ++count;
                if (count == 512) {
                    char b[70000];
                    snprintf(b, sizeof b, "Too many blocks (%d limit) in object '%s' in xml '%s'.", 512, name,
                             path);
                    reps.push_back(std::string("1:") + b);
                }
            }
            if (!eb)
                return true;
            char* nb = e + 1;
            if (nb[0] == '/' && nb[1] == '>') {
                closing = true;
                return true;
            }
            if (nb[0] == '>' || !nb[0])
                return true;
            if (cursor >= size)
                return false;
            p = nb;
        }
    }
};

static std::string Render(const char* name, bool closing, int count, char** n, char** v)
{
    std::string o = name ? std::string("T[") + name + "]" : "X";
    if (closing)
        o += "/";
    for (int i = 0; i < count; ++i)
        o += std::string(" ") + n[i] + "=" + v[i];
    return o;
}

}  // namespace

int CompareWithModel(unsigned seed)
{
    static HostServices hs{};
    hs.ReportError = Rep;
    HostServices* previous = hostServices;
    hostServices = &hs;
    const char* atoms[] = {"<",  ">",    "/",    "=",         "\"",     "!",     "-",    "\\",
                           "a",  "b",    "1",    " ",         "\n",     "\t",    "\r",   "&",
                           "?",  "<!--", "-->",  "<![CDATA[", "]]>",    "<a ",   "b=\"", "\" ",
                           "</", "/>",   "\xe9", "x",         "&quot;", "&amp;", "\\\"", "\\\\"};
    int N = sizeof atoms / sizeof *atoms;
    std::mt19937 rng(seed);
    long iters = 20000;
    int bad = 0;
    for (long it = 0; it < iters && bad < 5; ++it) {
        std::string body = "<?xml?>";
        int len = rng() % 40;
        for (int i = 0; i < len; ++i)
            body += atoms[rng() % N];
        if (rng() % 50 == 0)
            body += std::string(16380 + rng() % 8, "ab \"<"[rng() % 5]) + atoms[rng() % N] + atoms[rng() % N];
        std::vector<std::string> real, realReps;
        sink = &realReps;
        XmlReader r;
        if (!r.OpenFromMemory("t.xml", body.data(), body.size()))
            continue;
        std::vector<int> realCur;
        while (XmlBlock* b = r.ReadBlock()) {
            real.push_back(Render(b->name, b->closing, b->count, b->attributeNames, b->attributeValues));
            realCur.push_back(r.cursor);
        }
        Ref m;
        m.d = body + std::string(8, '\0');
        m.size = body.size();
        m.cursor = 7;
        std::vector<std::string> mod;
        std::vector<int> modCur;
        while (m.Block()) {
            mod.push_back(Render(m.name, m.closing, m.count, m.names, m.values));
            modCur.push_back(m.cursor);
        }
        if (real != mod || realReps != m.reps || realCur != modCur) {
            ++bad;
            ADD_FAILURE() << "reader and model differ on: [" << body.substr(0, 300) << "] len "
                          << body.size();
            for (auto& s : real)
                std::cerr << " real " << s.substr(0, 200) << "\n";
            for (auto& s : mod)
                std::cerr << " ref  " << s.substr(0, 200) << "\n";
            for (auto& s : realReps)
                std::cerr << " realR " << s.substr(0, 300) << "\n";
            for (auto& s : m.reps)
                std::cerr << " refR  " << s.substr(0, 300) << "\n";
        }
    }
    hostServices = previous;
    return bad;
}

TEST(XmlReaderModel, AgreesOnRandomInputs)
{
    for (unsigned seed : {1u, 2u, 3u}) {
        SCOPED_TRACE(seed);
        EXPECT_EQ(CompareWithModel(seed), 0);
    }
}
