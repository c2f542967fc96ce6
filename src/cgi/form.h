// Reading form fields into buffers of the sizes the pages rely on.
#pragma once

#include "cgi/fixed_text.h"
#include "platform/cgic.h"

// The form field `name` in a zeroed N-byte buffer: at most N-1 bytes of it, and the
// empty text when the field is missing.
template <std::size_t N>
FixedText<N> form_value(const char* name)
{
    FixedText<N> value;
    cgiFormString(name, value.data(), FixedText<N>::size());
    return value;
}
