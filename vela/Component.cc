#include "vela/Component.h"

#include "vela/report.h"

namespace vela {

Instance::Instance(const CompDesc_t& target, MsgQueue* queue, int inUse)
    : StdResource(target, queue, inUse), reserved_(inUse != 0) {}

Instance::Instance(const TmpInstance& other, int inUse) : StdResource(other) {
    if (inUse != 0)
        Instance::use(0);
}

void Instance::use(unsigned int payload) {
    StdResource::use(payload);
    reserved_ = true;
}

void Instance::unuse() {
    StdResource::unuse();
    reserved_ = false;
}

void Instance::free() {
    StdResource::free();
    reserved_ = false;
}

Instance::~Instance() {
    endCallbacks();
    if (!ownsUse_ || !reserved_)
        return;
    try {
        Instance::unuse();
    } catch (const Exception& exception) {
        report(exception);  // a destructor must not throw
    } catch (...) {
        report("an instance could not be given back");
    }
}

}  // namespace vela
