// The class that the members which receive messages are cast to.
#ifndef HOSTSVC_KSASYNCMSGRECEIVER_H
#define HOSTSVC_KSASYNCMSGRECEIVER_H

// Empty: a receiver derives from it and hands over the KSAsyncMsgReceiver part of its object.
class KSAsyncMsgReceiver {};

#endif
