#include "Cases.h"

int main(int argc, char** argv) {
  RegisterSearches();
  RegisterEdits();
  RegisterConversions();
  benchmark::Initialize(&argc, argv);
  benchmark::RunSpecifiedBenchmarks();
}
