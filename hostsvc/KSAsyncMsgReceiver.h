// The base class of objects that receive messages.
#ifndef HOSTSVC_KSASYNCMSGRECEIVER_H
#define HOSTSVC_KSASYNCMSGRECEIVER_H

// The class is empty. A receiver derives from it, registers a pointer to the KSAsyncMsgReceiver part of its
// object, and casts its member function to a member of this class.
class KSAsyncMsgReceiver {};

#endif
