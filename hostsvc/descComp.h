// Compares transport addresses.
#ifndef HOSTSVC_DESCCOMP_H
#define HOSTSVC_DESCCOMP_H

#include "norv/norv.h"

// Ignores the two unused octets.
inline bool descComp(NvCompDesc a, NvCompDesc b) {
    return a.instance == b.instance && a.board == b.board && a.processor == b.processor &&
           a.component == b.component && a.node == b.node;
}

#endif
