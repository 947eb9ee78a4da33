#include "apps/ombrix/Commands.h"
#include "apps/ombrix/Program.h"
namespace ombrix {
int runVerify(Program& program) { return program.failUsage("verify"); }
}
