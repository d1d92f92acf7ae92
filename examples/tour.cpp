// A short tour of nax on built-in data: complex numbers and run-time sized vectors.
#include <nax/nax.h>

#include <cstdio>

namespace {

void PrintComplex(const char* label, const CNaxComplex<double>& z) {
  std::printf("  %-28s %9.5f %+9.5fi   |z| = %.5f, arg = %8.3f deg\n", label, z.Real(), z.Imag(),
              naxAbs(z), z.AngleInDegrees());
}

void ComplexNumbers() {
  std::printf("Complex numbers\n");
  const CNaxComplex<double> a(3, 4), b(1, -2);
  PrintComplex("a", a);
  PrintComplex("b", b);
  PrintComplex("a * b", a * b);
  PrintComplex("a / b", a / b);
  PrintComplex("a^5", a.Power(5));
  CNaxComplex<double> roots[3];
  a.Roots(3, roots);
  for (int k = 0; k < 3; ++k) {
    char label[32];
    std::snprintf(label, sizeof label, "cube root %d of a", k);
    PrintComplex(label, roots[k]);
  }
  const CNaxComplex<double> q = a / CNaxComplex<double>(0, 0);
  std::printf("  a / 0 gives the pseudo-infinity %.9g in both parts\n", q.Real());
}

void Vectors() {
  std::printf("\nRun-time sized vectors\n");
  const int32 n = 8;
  CNaxVectorN<double> v(n), w(n, 1.0);
  for (int32 i = 0; i < n; ++i) v[i] = i - 3.5;
  std::printf("  v = (");
  for (int32 i = 0; i < n; ++i) std::printf("%s%g", i ? ", " : "", v[i]);
  std::printf(")\n");
  std::printf("  |v| = %.6f   |v|_1 = %g   |v|_inf = %g   v . w = %g\n", v.Length(), v.Norm1(),
              v.NormInf(), v.Dot(w));
  CNaxVectorN<double> u(v);
  u.Normalize();
  std::printf("  v normalised: |u| = %.15f, largest |component| %g at index %d\n", u.Length(),
              u.GetMaxComponent(1), u.GetIndexOfMaxComponent(1));
  const CNaxVectorN<double> tiny(3, 1e-5);
  std::printf("  a vector of three 1e-5 has length %g (below the dead zone of the safe root)\n",
              tiny.Length());
}

}  // namespace

int main() {
  ComplexNumbers();
  Vectors();
  return 0;
}
