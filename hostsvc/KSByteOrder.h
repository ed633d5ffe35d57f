// Converts 32-bit words from host order (little-endian) to network order and back.
#ifndef HOSTSVC_KSBYTEORDER_H
#define HOSTSVC_KSBYTEORDER_H

// Both functions reverse the octets of each whole 32-bit word in the first nbytes octets of src and write
// them to the same place of dst, which may be src. Octets after the last whole word are left unchanged. The
// pointers need no alignment.
void KS_htonU32(void* dst, void* src, int nbytes);
void KS_ntohU32(void* dst, void* src, int nbytes);

#endif
