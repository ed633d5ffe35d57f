// Reads host names, addresses and numbers.
#ifndef HOSTSVC_HOSTNAMES_H
#define HOSTSVC_HOSTNAMES_H

// Returns 1 when the text is a name and not an address in digits and dots: it has an ASCII character above
// '9'.
int is_dn(const char* name);

// Looks the name up and writes its first IPv4 address, in digits and dots, into dst (16 octets). Writes an
// empty text when it has none.
void dntoip(char* dst, const char* name);

// Reads a decimal number, or a hexadecimal one after "0x" or "-0x". With a capital X the result is 0.
int stn(const char* text);

#endif
