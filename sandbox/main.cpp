#include "Invocation.h"
#include "ToolProgram.h"
#include "administration/Administration.h"

int main(int argc, char** argv) {
  using namespace lumora::sandbox;
  const Invocation invocation = Invocation::current();
  return invocation.tool ? runTool(invocation, argc, argv) : administrate(argc, argv);
}
