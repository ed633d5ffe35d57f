// Host order (little-endian) to network order and back, for runs of 32-bit words.
#ifndef HOSTSVC_KSBYTEORDER_H
#define HOSTSVC_KSBYTEORDER_H

// Both reverse each whole 32-bit word in the first nbytes octets of src into the same place of dst, which may
// be src; octets beyond the last whole word are not touched. No alignment is needed.
void KS_htonU32(void* dst, void* src, int nbytes);
void KS_ntohU32(void* dst, void* src, int nbytes);

#endif
