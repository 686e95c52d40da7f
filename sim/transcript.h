#ifndef TAVIWIRELESS_SIM_TRANSCRIPT_H
#define TAVIWIRELESS_SIM_TRANSCRIPT_H

#include <cstdio>
#include <memory>
#include <string>

namespace taviwireless::sim {

// What went over the lines, with times; to a file, or nowhere.
class Transcript {
  public:
    Transcript() = default;
    // "-" is standard error. Throws std::runtime_error when the file cannot be written.
    explicit Transcript(const std::string& path);

    // direction: '<' from the client, '>' to the client.
    void Note(const std::string& port, char direction, const std::string& bytes);

  private:
    struct Close {
        void operator()(FILE* file) const {
            if (file != stderr) {
                std::fclose(file);
            }
        }
    };
    std::unique_ptr<FILE, Close> file_;
};

}  // namespace taviwireless::sim

#endif
