// The decoders of the information elements (Q.931, 4.5, and the switches' own elements).
//
// Each gets the identifier, which has been taken already. It takes the octets of the element that it knows
// from the cursor and writes them line by line. Octets that it does not take become the next identifiers.
// Only network_specific_fac names values of a field (carrier services); all others show bits.
#ifndef DECODER_ELEMENTS_H
#define DECODER_ELEMENTS_H

#include "decoder/cursor.h"

namespace decoder {

// elements_bearer.cc
void bearer_capability(unsigned char id, RingBuffer* rb);
void low_layer_compat(unsigned char id, RingBuffer* rb);
void high_layer_compat(unsigned char id, RingBuffer* rb);

// elements_channel.cc
void channel_identification(unsigned char id, RingBuffer* rb);
void BlockChanId(unsigned char id, RingBuffer* rb);
void changestatus(unsigned char id, RingBuffer* rb);
void restart_indicator(unsigned char id, RingBuffer* rb);
void call_appearance_ie(unsigned char id, RingBuffer* rb);  // no identifier leads to it

// elements_indication.cc
void fun_cause(unsigned char id, RingBuffer* rb);
void callstate(unsigned char id, RingBuffer* rb);
void progress_indicator(unsigned char id, RingBuffer* rb);
void notification_indicator(unsigned char id, RingBuffer* rb);
void signal_fun(unsigned char id, RingBuffer* rb);
void information_req(unsigned char id, RingBuffer* rb);
void feature_indication(unsigned char id, RingBuffer* rb);
void terminal_capabilities(unsigned char id, RingBuffer* rb);
void AdviceOfCharge(unsigned char id, RingBuffer* rb);
void callidentity(unsigned char id, RingBuffer* rb);

// elements_number.cc
void calling_party_num(unsigned char id, RingBuffer* rb);
void calling_party_subaddress(unsigned char id, RingBuffer* rb);
void called_party_num(unsigned char id, RingBuffer* rb);
void called_party_subaddress(unsigned char id, RingBuffer* rb);
void connected_number(unsigned char id, RingBuffer* rb);
void original_called_num(unsigned char id, RingBuffer* rb);
void redirecting_number(unsigned char id, RingBuffer* rb);
void transit_network_selection(unsigned char id, RingBuffer* rb);

// elements_facility.cc
void facility(unsigned char id, RingBuffer* rb);
void network_specific_fac(unsigned char id, RingBuffer* rb);
void display(unsigned char id, RingBuffer* rb);
void datetime(unsigned char id, RingBuffer* rb);
void useruser(unsigned char id, RingBuffer* rb);
void user_to_user_facility(unsigned char id, RingBuffer* rb);
void service_profile_id(unsigned char id, RingBuffer* rb);  // no identifier leads to these three
void end_pointID(unsigned char id, RingBuffer* rb);
void service_indicator(unsigned char id, RingBuffer* rb);

}  // namespace decoder

#endif
