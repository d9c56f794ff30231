#include "mtUtil.h"

#include <iostream>

#include "mtSystemReport.h"
#include "sleeper.h"

namespace Orv {

void MtUtil::yield() noexcept {
    Sleeper::yield();
}

void MtUtil::printSysConf() {
    printSysConf(std::cout);
}

void MtUtil::printSysConf(std::ostream& stream) {
    MtSystemReport::take().print(stream);
    stream.flush();
}

}  // namespace Orv
