// What the program asks and sets before all else.
#include "tests/contract/contract.h"

namespace contract {

CONTRACT(Start, TheCommandLineBeginsWithTheProgramsName) {
  const std::string line = GetCommandLineA();
  Expect({line.find("seam_contract.exe") != std::string::npos}, {true});
}

CONTRACT(Start, TheErrorModeIsReplacedAndTold) {
  constexpr UINT kNoBoxes = SEM_FAILCRITICALERRORS | SEM_NOOPENFILEERRORBOX;
  const UINT before = SetErrorMode(kNoBoxes);
  Expect({SetErrorMode(before), SetErrorMode(before)}, {kNoBoxes, before});
}

}  // namespace contract
