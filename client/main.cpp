#include "Client.h"

int main(int argc, char** argv) {
  return lumora::client::runClient({argv + 1, argv + argc});
}
