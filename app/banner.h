// What every run starts with, on the screen and in the log.
#ifndef APP_BANNER_H
#define APP_BANNER_H

namespace app {

void telvar_header();

}  // namespace app

#endif
