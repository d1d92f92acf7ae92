// A tiny program that uses the installed library: exits 0 when the results are right.
#include <nax/nax.h>

int main() {
  CNaxComplex<double> z(3.0, 4.0);
  CNaxVectorN<double> v(3, 2.0);
  const double length = v.Length();
  return (naxAbs(z) == 5.0 && length > 3.46 && length < 3.47) ? 0 : 1;
}
