// The base classes of the layer's exceptions. Most hold no data: callers tell them apart by type. Every one
// of them can be caught as a KSException.
#ifndef HOSTSVC_KSEXCEPTION_H
#define HOSTSVC_KSEXCEPTION_H

// Never thrown by itself.
class KSException {};

// A queue, a thread or another resource could not be created.
class KSResource_CreationError : public virtual KSException {};

#endif
