// Short human texts for the status codes the library, the transformation engine and
// the reference plug-ins report (the library itself attaches no text to a code).
#ifndef QZSCORE_STATUSTEXT_H_
#define QZSCORE_STATUSTEXT_H_

#include <string>

namespace qzscore {

// "CODE: text", for example "260004: the PMML file cannot be opened". A code without a
// known meaning gets a text saying so. Never throws except std::bad_alloc.
std::string DescribeStatus(long code);

}  // namespace qzscore

#endif  // QZSCORE_STATUSTEXT_H_
