#include "vela/Component.h"

#include "vela/report.h"

namespace vela {

Instance::Instance(const CompDesc_t& target, MsgQueue* queue, int inUse)
    : StdResource(target, queue, inUse), reserved_(inUse != 0) {}

Instance::Instance(const TmpInstance& other, int inUse)
    : Instance(other.getTgtDesc(), other.getMsgQueue(), inUse) {}

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
