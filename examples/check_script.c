/* Checks a script without a generator, lists what it becomes, and computes what it plays.
 *
 *   cc check_script.c $(pkg-config --cflags --libs ktorba_tools) -o check_script && ./check_script
 */
#include <ktorba/script_tools.h>
#include <stdio.h>
#include <string.h>

static const char kWrong[] = "script pulses\n  repeat 3\n    genrate pulse\n  end repeat\nend script\n";
static const char kRight[] = "script pulses\n  repeat 3\n    generate pulse\n  end repeat\nend script\n";
static const char kWaveforms[] = "[{\"name\": \"pulse\", \"samples\": 1000}]";

static void showLength(const ktTools_Program* program) {
  ktTools_Timeline* timeline = NULL;
  ktTools_Length length;
  if (ktTools_MakeTimeline(program, 0, NULL, 0, &timeline) == 0 && ktTools_PlayLength(timeline, &length) == 0 &&
      length.kind == KTTOOLS_LENGTH_EXACT) {
    printf("It plays %lu samples.\n", (unsigned long)length.samples);
  }
  ktTools_FreeTimeline(timeline);
}

int main(void) {
  ktTools_Document document = {NULL, 0};
  ktTools_Program* program = NULL;
  const uint32_t* words = NULL;
  uint64_t count = 0;
  int32_t code = ktTools_Check(kWrong, strlen(kWrong), NULL, 0, &document);
  if (code != 0) return 1;
  printf("%s\n", document.text);
  ktTools_FreeDocument(&document);

  code = ktTools_Compile(kRight, strlen(kRight), NULL, 0, kWaveforms, strlen(kWaveforms), &program, &document);
  if (code != 0) {
    printf("%s: %s\n", ktTools_DescribeCode(code), document.text == NULL ? "" : document.text);
    ktTools_FreeDocument(&document);
    return 1;
  }
  ktTools_FreeDocument(&document);
  if (ktTools_Words(program, 0, &words, &count) == 0 && ktTools_List(program, 0, &document) == 0) {
    printf("%lu instructions, the first is %08lx\n%s\n", (unsigned long)count, (unsigned long)words[3], document.text);
  }
  ktTools_FreeDocument(&document);
  showLength(program);
  ktTools_FreeProgram(program);
  return 0;
}
