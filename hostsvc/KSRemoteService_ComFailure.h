#ifndef HOSTSVC_KSREMOTESERVICE_COMFAILURE_H
#define HOSTSVC_KSREMOTESERVICE_COMFAILURE_H

#include <array>
#include <cstring>

#include "hostsvc/KSException.h"

// The connection to the relay is lost: too many reads in a row have failed.
class KSRemoteService_ComFailure : public virtual KSException {
  public:
    KSRemoteService_ComFailure(const char* hostName, int port) : port_(port) {
        std::strncpy(hostName_.data(), hostName, hostName_.size() - 1);
    }

    const char* hostName() const { return hostName_.data(); }  // its first 99 characters
    int port() const { return port_; }

  private:
    std::array<char, 100> hostName_{};
    int port_;
};

#endif
