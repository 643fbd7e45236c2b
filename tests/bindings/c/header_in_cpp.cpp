// The header is C++ as well, whatever its standard.
#include <quenby/quenby.h>

int main() {
  return quenby_abi() == QUENBY_ABI ? 0 : 1;
}
