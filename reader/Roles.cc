#include "reader/Roles.h"

namespace reader {

void Roles::sayUnknown() {
    chatter_.note(
        "nothing tells which side of the link ours is; frames are written as those of the user side "
        "(--role names it)");
}

}  // namespace reader
