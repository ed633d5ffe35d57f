// The fixed parts of the page of `lapdread report`. The build makes these strings from the files in this
// folder.
#ifndef READER_REPORT_ASSETS_H
#define READER_REPORT_ASSETS_H

#include <string_view>

namespace reader::assets {

extern const std::string_view page;  // with {{NAME}} where a part is put in
extern const std::string_view style;
extern const std::string_view tablesScript;
extern const std::string_view chartsScript;
extern const std::string_view chartLibrary;  // Chart.js
extern const std::string_view chartLicence;

}  // namespace reader::assets

#endif
