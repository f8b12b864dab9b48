#include <ktorba/ktorba.h>
#include <stdio.h>

int main(void) {
  tStatus status = {0, 0, NULL, NULL};
  int32_t code = ktORBA_StartGeneration(1, &status);
  printf("%d %d\n", (int)code, (int)status.code);
  return code == -52005 && status.code == (ELABORATING ? code : 0) ? 0 : 1;
}
