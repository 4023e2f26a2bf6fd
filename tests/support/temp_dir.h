// A directory of the test's own under the system's temporary directory, removed with its content,
// and the reading and patching of the files that a test finds there.
#ifndef KVSVAPI_TESTS_TEMP_DIR_H
#define KVSVAPI_TESTS_TEMP_DIR_H

#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <stdexcept>
#include <string>

namespace kvsvtest {

class cTempDir {
 public:
  cTempDir() : path_((std::filesystem::temp_directory_path() / "kvsvtest.XXXXXX").string()) {
    if (mkdtemp(path_.data()) == nullptr) throw std::runtime_error("mkdtemp failed");
  }
  // A test may have taken the owner's rights away.
  ~cTempDir() {
    std::error_code ignored;
    std::filesystem::permissions(path_, std::filesystem::perms::owner_all, ignored);
    std::filesystem::remove_all(path_, ignored);
  }
  cTempDir(const cTempDir &) = delete;
  cTempDir &operator=(const cTempDir &) = delete;
  const std::string &Path() const { return path_; }
  std::string Sub(const std::string &relative) const { return path_ + "/" + relative; }
  void WriteFile(const std::string &relative, const std::string &content) const {
    std::ofstream(Sub(relative), std::ios::binary) << content;
  }

 private:
  std::string path_;
};

inline std::string ReadFile(const std::string &path) {
  std::ifstream in(path, std::ios::binary);
  return std::string(std::istreambuf_iterator<char>(in), std::istreambuf_iterator<char>());
}

inline void WriteAt(const std::string &path, long offset, const std::string &text) {
  std::fstream file(path, std::ios::in | std::ios::out | std::ios::binary);
  file.seekp(offset);
  file.write(text.data(), static_cast<std::streamsize>(text.size()));
}

}  // namespace kvsvtest

#endif
