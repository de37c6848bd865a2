#include <LumoraKit/platform/linux/Backends.h>
#include <LumoraKit/platform/linux/ChildProcess.h>
#include <LumoraKit/platform/linux/PosixToolRunner.h>
#include <LumoraKit/platform/linux/ToolExchange.h>

#include <system_error>

namespace lumora::backend {
namespace {

constexpr int cannotRunStatus = 127;

struct ToolPipes {
  Pipe input;
  Pipe output;
  Pipe error;

  int open() {
    for (Pipe* const pipe : {&input, &output, &error}) {
      if (const int failure = pipe->open()) {
        return failure;
      }
    }
    return 0;
  }

  ChildDescriptors childEnds() const { return {input.readEnd.get(), output.writeEnd.get(), error.writeEnd.get()}; }

  void closeChildEnds() {
    input.readEnd.close();
    output.writeEnd.close();
    error.writeEnd.close();
  }
};

int failed(const std::string& executable, const std::string& reason, std::string& standardError) {
  standardError += executable + ": " + reason;
  return cannotRunStatus;
}

} // namespace

int PosixToolRunner::run(const std::string& executable, const std::vector<std::string>& arguments,
                         const std::string& standardInput, std::string& standardOutput, std::string& standardError) {
  standardOutput.clear();
  standardError.clear();
  ToolPipes pipes;
  ChildProcess child;
  int error = pipes.open();
  if (error == 0) {
    error = child.start(executable, arguments, pipes.childEnds());
  }
  if (error != 0) {
    return failed(executable, std::generic_category().message(error), standardError);
  }
  pipes.closeChildEnds();
  error =
      ToolExchange(child, {std::move(pipes.input.writeEnd), standardInput},
                   {std::move(pipes.output.readEnd), standardOutput}, {std::move(pipes.error.readEnd), standardError})
          .run();
  if (error != 0) {
    const std::string reason = std::generic_category().message(error);
    return failed(executable, "a part of its input or output was lost: " + reason, standardError);
  }
  return child.status() >= 0 ? child.status()
                             : failed(executable, "the exit status was taken by another wait", standardError);
}

std::shared_ptr<ToolRunner> makeToolRunner() {
  return std::make_shared<PosixToolRunner>();
}

} // namespace lumora::backend
