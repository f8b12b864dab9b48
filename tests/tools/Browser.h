// A browser without a window, driven over a pair of pipes: JSON messages, each ended by a zero byte. It is the program
// chromium-headless-shell; where that is not installed, isInstalled() is false and tests skip with what it is called.
// One thread.
#pragma once

#include <nlohmann/json.hpp>
#include <string>
#include <vector>

class Browser {
 public:
  static constexpr char kProgram[] = "chromium-headless-shell";
  static bool isInstalled();

  // A page of that size, empty. Throws std::runtime_error when the browser does not start or, in any call, when it does
  // not answer within half a minute or refuses.
  Browser(int width, int height);
  ~Browser();
  Browser(const Browser&) = delete;
  Browser& operator=(const Browser&) = delete;

  void open(const std::string& url);  // until it is loaded, and its first frame drawn

  // The value of an expression; of a promise, what it comes to.
  nlohmann::json evaluate(const std::string& expression);

  nlohmann::json call(const std::string& method, const nlohmann::json& parameters);

  const std::vector<std::string>& requests() const { return requests_; }  // addresses of what the page asked for
  const std::vector<std::string>& problems() const { return problems_; }  // what it printed or threw

 private:
  void start(int width, int height);
  void send(const nlohmann::json& message);
  nlohmann::json receive();
  void note(const nlohmann::json& event);

  int process_ = -1;
  int commands_ = -1;
  int answers_ = -1;
  std::string folder_;  // for its profile
  std::string session_;
  std::string unread_;
  int lastId_ = 0;
  bool isLoaded_ = false;
  std::vector<std::string> requests_;
  std::vector<std::string> problems_;
};
