// The roots of the layer's errors. All are empty: callers tell them apart by type, and every one of them is
// caught as a KSException.
#ifndef HOSTSVC_KSEXCEPTION_H
#define HOSTSVC_KSEXCEPTION_H

// Never thrown by itself.
class KSException {};

// A queue, a thread or another resource could not be created.
class KSResource_CreationError : public virtual KSException {};

#endif
