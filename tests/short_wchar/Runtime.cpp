// tests/short_wchar/Runtime.cpp - what the libraries have for wchar_t of 32 bits, for 16 bits.
//
// Compiled with -fshort-wchar, like the units under test. std::wstring is made here, because that
// of the library counts in 32 bits; what it asks of the C library comes here by the linker's
// --wrap.
#include <algorithm>
#include <cwchar>
#include <string>

static_assert(sizeof(wchar_t) == 2);

template class std::basic_string<wchar_t>;

extern "C" {

size_t __wrap_wcslen(const wchar_t *text)
{
    const wchar_t *end = text;
    while (*end)
        ++end;
    return end - text;
}

wchar_t *__wrap_wmemcpy(wchar_t *to, const wchar_t *from, size_t count)
{
    std::copy_n(from, count, to);
    return to;
}

wchar_t *__wrap_wmemmove(wchar_t *to, const wchar_t *from, size_t count)
{
    if (to > from)
        std::copy_backward(from, from + count, to + count);
    else
        std::copy_n(from, count, to);
    return to;
}

wchar_t *__wrap_wmemset(wchar_t *to, wchar_t character, size_t count)
{
    std::fill_n(to, count, character);
    return to;
}

int __wrap_wmemcmp(const wchar_t *a, const wchar_t *b, size_t count)
{
    auto [inA, inB] = std::mismatch(a, a + count, b);
    return inA == a + count ? 0 : *inA < *inB ? -1 : 1;
}

const wchar_t *__wrap_wmemchr(const wchar_t *text, wchar_t character, size_t count)
{
    const wchar_t *found = std::find(text, text + count, character);
    return found == text + count ? nullptr : found;
}

} // extern "C"
