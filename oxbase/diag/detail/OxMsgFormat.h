// OxMsgFormat.h: what the printf format of a message text will read.
//
// Message texts come from a file that anybody may have put in the working
// directory, and they are handed to vsnprintf with the library's arguments.
// These two checks run when a message file is loaded: `disarm` turns every
// %n (which writes through its argument) into %p (which prints it), and
// `fits` tells whether a text reads only the arguments a caller passes.
//
//   char text[] = "done%n";
//   OxMsgFormatDisarm(text);                      // text is now "done%p"
//   bool safe = OxMsgFormatFits("In %s, line %u", "suus");   // true
#ifndef OXBASE_DIAG_DETAIL_OXMSGFORMAT_H
#define OXBASE_DIAG_DETAIL_OXMSGFORMAT_H

namespace oxbase {
namespace detail {

/// Rewrites, in place, each %n conversion of `text` as a %p conversion that
/// keeps its argument number, width and precision and drops its flags and
/// length ("%-5hn" becomes "%5p"), so that the pointer argument meant for it
/// is printed instead of written to, and every later conversion still meets
/// its own argument. Returns how many there were; null gives 0.
unsigned int OxMsgFormatDisarm(char* text);

/// Whether formatting `text` reads no more arguments than `arguments` lists
/// and each of the kind listed, in order: 's' a text (`%s` with flags, width
/// and precision as digits), 'u' an unsigned int (`%d %i %u %o %x %X %c`,
/// optionally with `h` or `hh`). "%%" reads nothing. A `*` width or
/// precision, a numbered argument (`%1$s`), any other length or conversion,
/// and a '%' at the end of the text make it unfit. A null text fits.
bool OxMsgFormatFits(const char* text, const char* arguments);

} // namespace detail
} // namespace oxbase

#endif
