/* Checks a script without a generator, and lists what it becomes.
 *
 *   cc check_script.c $(pkg-config --cflags --libs ktorba_tools) -o check_script && ./check_script
 */
#include <ktorba/script_tools.h>
#include <stdio.h>
#include <string.h>

static const char kWrong[] = "script pulses\n  repeat 3\n    genrate pulse\n  end repeat\nend script\n";
static const char kRight[] = "script pulses\n  repeat 3\n    generate pulse\n  end repeat\nend script\n";
static const char kWaveforms[] = "[{\"name\": \"pulse\", \"samples\": 1000}]";

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
  ktTools_FreeProgram(program);
  return 0;
}
