#include "core/status.h"

uint32_t MessageForStatus(StatusCode code) {
  switch (code) {
    case StatusInternal:
      return 1001;
    case StatusBufferTooSmall:
    case StatusNoMemory:
      return 1002;
    case StatusBadDirectory:
      return 1003;
    case StatusNoSystemDir:
      return 1004;
    case StatusCreateFileFailed:
      return 1005;
    case StatusCreateDirFailed:
      return 1006;
    case StatusBadRecord:
      return 1007;
    case StatusOpenFailed:
      return 1008;
    case StatusWriteRemovalFailed:
      return 1009;
    case StatusReadFailed:
    case StatusSeekFailed:
      return 1010;
    case StatusDeleteFailed:
      return 1011;
    case StatusBadPackage:
      return 1012;
    case StatusExpandFailed:
      return 1013;
    case StatusNotRegistered:
      return 1014;
    case StatusCancelled:
      return 1015;
    case StatusServicesRemain:
      return 1016;
    case StatusNoDiskSpace:
      return 1018;
    default:
      return 1000;
  }
}
