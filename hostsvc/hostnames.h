// Host names, addresses and numbers in text.
#ifndef HOSTSVC_HOSTNAMES_H
#define HOSTSVC_HOSTNAMES_H

// 1 when the text is a name rather than an address in digits and dots: some character comes after '9'.
// Characters beyond ASCII do not count.
int is_dn(const char* name);

// The name's first IPv4 address, in digits and dots, into dst (16 octets); empty when there is none.
void dntoip(char* dst, const char* name);

// A decimal number, or a hexadecimal one behind "0x" or "-0x". With an 'X' it is 0.
int stn(const char* text);

#endif
