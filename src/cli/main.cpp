#include "cli/command.h"

int main(int count, char** arguments) {
  return fotomill::cli::RunCommandLine(count, arguments, {});
}
