#include "Browser.h"

#include <fcntl.h>
#include <poll.h>
#include <signal.h>
#include <sys/wait.h>
#include <unistd.h>

#include <array>
#include <filesystem>
#include <sstream>
#include <stdexcept>

using nlohmann::json;

namespace {

constexpr int kTimeoutMs = 30'000;
constexpr int kCommands = 3;  // the descriptors that the browser reads and writes
constexpr int kAnswers = 4;

std::string findProgram() {
  std::istringstream folders(getenv("PATH"));
  for (std::string folder; std::getline(folders, folder, ':');) {
    const std::string path = folder + "/" + Browser::kProgram;
    if (access(path.c_str(), X_OK) == 0) return path;
  }
  return {};
}

// Never one of the descriptors that the browser is given.
std::array<int, 2> makePipe() {
  std::array<int, 2> ends{};
  if (pipe(ends.data()) != 0) throw std::runtime_error("no pipe");
  for (int& end : ends) {
    const int low = end;
    end = fcntl(low, F_DUPFD_CLOEXEC, 10);
    close(low);
  }
  return ends;
}

}  // namespace

bool Browser::isInstalled() { return !findProgram().empty(); }

Browser::Browser(int width, int height) {
  signal(SIGPIPE, SIG_IGN);
  start(width, height);
  const json target = call("Target.createTarget", {{"url", "about:blank"}});
  session_ = call("Target.attachToTarget", {{"targetId", target["targetId"]}, {"flatten", true}})["sessionId"];
  for (const char* domain : {"Page", "Runtime", "Network", "Log"})
    call(domain + std::string(".enable"), json::object());
  call("Emulation.setFocusEmulationEnabled", {{"enabled", true}});
}

Browser::~Browser() {
  close(commands_);
  close(answers_);
  kill(process_, SIGKILL);
  waitpid(process_, nullptr, 0);
  std::error_code ignored;
  std::filesystem::remove_all(folder_, ignored);
}

void Browser::start(int width, int height) {
  std::string folder = std::filesystem::temp_directory_path() / "browserXXXXXX";
  if (mkdtemp(folder.data()) == nullptr) throw std::runtime_error("no folder for the browser");
  folder_ = folder;
  const auto commands = makePipe();
  const auto answers = makePipe();
  std::vector<std::string> arguments{findProgram(),
                                     "--remote-debugging-pipe",
                                     "--user-data-dir=" + folder_,
                                     "--disable-gpu",
                                     "--hide-scrollbars",
                                     "--window-size=" + std::to_string(width) + "," + std::to_string(height)};
  if (geteuid() == 0) arguments.push_back("--no-sandbox");
  std::vector<char*> pointers;
  for (std::string& argument : arguments) pointers.push_back(argument.data());
  pointers.push_back(nullptr);
  process_ = fork();
  if (process_ == 0) {
    dup2(commands[0], kCommands);
    dup2(answers[1], kAnswers);
    dup2(::open("/dev/null", O_WRONLY), STDERR_FILENO);
    execv(pointers[0], pointers.data());
    _exit(127);
  }
  close(commands[0]);
  close(answers[1]);
  commands_ = commands[1];
  answers_ = answers[0];
}

void Browser::open(const std::string& url) {
  isLoaded_ = false;
  call("Page.navigate", {{"url", url}});
  while (!isLoaded_) note(receive());
  evaluate("new Promise((done) => requestAnimationFrame(() => setTimeout(done)))");
}

json Browser::evaluate(const std::string& expression) {
  const json answer =
      call("Runtime.evaluate", {{"expression", expression}, {"returnByValue", true}, {"awaitPromise", true}});
  if (answer.contains("exceptionDetails")) throw std::runtime_error(answer["exceptionDetails"].dump());
  return answer["result"].value("value", json());
}

json Browser::call(const std::string& method, const json& parameters) {
  json message{{"id", ++lastId_}, {"method", method}, {"params", parameters}};
  if (!session_.empty()) message["sessionId"] = session_;
  send(message);
  for (;;) {
    json answer = receive();
    if (answer.value("id", 0) != lastId_) {
      note(answer);
      continue;
    }
    if (answer.contains("error")) throw std::runtime_error(method + ": " + answer["error"].dump());
    return answer["result"];
  }
}

void Browser::note(const json& event) {
  const std::string method = event.value("method", "");
  if (method == "Page.loadEventFired") isLoaded_ = true;
  if (method == "Network.requestWillBeSent") requests_.push_back(event["params"]["request"]["url"]);
  const bool isProblem =
      method == "Runtime.exceptionThrown" || method == "Runtime.consoleAPICalled" || method == "Log.entryAdded";
  if (isProblem) problems_.push_back(event["params"].dump());
}

void Browser::send(const json& message) {
  const std::string text = message.dump();
  std::size_t sent = 0;
  while (sent < text.size() + 1) {  // with the zero byte
    const ssize_t count = write(commands_, text.c_str() + sent, text.size() + 1 - sent);
    if (count <= 0) throw std::runtime_error("the browser reads no more");
    sent += static_cast<std::size_t>(count);
  }
}

json Browser::receive() {
  for (;;) {
    if (const std::size_t end = unread_.find('\0'); end != std::string::npos) {
      json message = json::parse(unread_.substr(0, end));
      unread_.erase(0, end + 1);
      return message;
    }
    pollfd waiting{answers_, POLLIN, 0};
    if (poll(&waiting, 1, kTimeoutMs) <= 0) throw std::runtime_error("the browser does not answer");
    std::array<char, 65536> bytes{};
    const ssize_t count = read(answers_, bytes.data(), bytes.size());
    if (count <= 0) throw std::runtime_error("the browser has ended");
    unread_.append(bytes.data(), static_cast<std::size_t>(count));
  }
}
