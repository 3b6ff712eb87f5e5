#include "platform/RunLoop.h"
