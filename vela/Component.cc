#include "vela/Component.h"

#include "vela/report.h"

namespace vela {

Instance::Instance(const CompDesc_t& target, MsgQueue* queue, int use) : StdResource(target, queue) {
    reserve(use);
}

Instance::Instance(const TmpInstance& other, int use) : StdResource(other) { reserve(use); }

void Instance::reserve(int use) {
    if (use == 0)
        return;
    StdResource::use(0);
    reserved_ = true;
}

Instance::~Instance() {
    endCallbacks();
    if (!ownsUse_ || !reserved_)
        return;
    try {
        unuse();
    } catch (const Exception& exception) {
        report(exception);  // nobody is left to tell
    } catch (const KSException&) {
        report("an instance could not be given back");
    }
}

}  // namespace vela
