// Shows ladders as sequence diagrams of Mermaid, which wikis and ticket systems draw.
#ifndef READER_LADDERMERMAID_H
#define READER_LADDERMERMAID_H

#include <string>

#include "reader/CallLadder.h"

namespace reader {

// Appends a block for Markdown, from "```mermaid" to "```".
void appendMermaid(std::string& to, const CallLadder& ladder, TimeText& times);

}  // namespace reader

#endif
