// Reads robot message definitions from files, with those that they refer to. The text of one file: MsgParser.h.
//
//   MsgReader reader;
//   reader.addFolder("/usr/share/geometry_msgs/msg");
//   const Description description = reader.read();
#pragma once

#include <filesystem>
#include <map>
#include <optional>
#include <set>
#include <string>
#include <vector>

#include "description/Description.h"
#include "description/MsgParser.h"

namespace inspector {

/// Reads <package>/msg/<Message>.msg files.
///
/// A message that is referred to is looked for among what was added, beside the file that refers to it, in the package
/// folders beside that file's package, and in /usr/share. Messages become structures; time and duration become
/// structures of two 32-bit integers, texts a dynamic string type, and arrays of any length dynamic matrices of one
/// dimension. A message without fields is refused, with all messages that contain it.
class MsgReader {
  public:
    /// Adds one file. Throws InputError when another file of the same package and message was added before.
    void addFile(const std::filesystem::path& file);

    /// Adds all .msg files of a folder, in the order of their names. Throws InputError when there is none, and as
    /// addFile().
    void addFolder(const std::filesystem::path& folder);

    /// Reads what was added and what that refers to. Throws InputError where a file or a definition is ill-formed, or
    /// a message is not found. Call it once.
    Description read();

  private:
    struct Message {
        std::string label; ///< "package/Message"
        std::filesystem::path file;
        std::vector<MessageField> fields;
        std::optional<Refusal> refusal;
    };

    struct Uses {
        std::set<std::string> types;                   ///< names, those of matrix elements included
        std::map<std::string, TypeReference> matrices; ///< by name, with what they hold
    };

    void add(const std::string& label, const std::filesystem::path& file);
    std::filesystem::path find(const MessageField& field, const Message& from) const;
    void refuse();
    void describe(Message& message, Description& description, Uses& uses) const;

    std::vector<Message> messages_;
    std::map<std::string, std::size_t> indexByLabel_; ///< of messages_
};

} // namespace inspector
