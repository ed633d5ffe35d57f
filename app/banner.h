// The title lines, which every run writes to the screen and to the log.
#ifndef APP_BANNER_H
#define APP_BANNER_H

namespace app {

void telvar_header();

}  // namespace app

#endif
