#include "Remedies.h"

#include <algorithm>
#include <iterator>

namespace
{

/// docs/doctor.md says more about each code.
constexpr struct
{
    std::string_view code;
    std::string_view remedy;
} Remedies[] = {
    {"always-hidden", "Merge the two provider elements, or put the more special one first."},
    {"bad-file-name", "Write a file name without a folder."},
    {"contract-version", "Get the version of the plug-in that is made for this library."},
    {"current-folder", "Put the needed library into the folder of the library that needs it, or into System32."},
    {"default-folder", "Name the folder of your host with --plugins."},
    {"does-not-load", "Install what is missing, or get the 64-bit version."},
    {"empty-file", "Remove the file, or write its settings."},
    {"empty-filter", "Add a FileType or a Folder, or remove the filter."},
    {"empty-name", "Tell the author of the plug-in."},
    {"empty-type", "Write the extensions that the filter includes."},
    {"ends-host", "Change or remove the text at once."},
    {"ends-process", "Remove the library, and tell its author."},
    {"entities", "Replace the entities by their texts."},
    {"file-type", "Write the extension alone, such as tmp."},
    {"folder-all", "Write the full path of the folder, with a backslash at its end."},
    {"folder-end", "Write a backslash at the end."},
    {"folder-relative", "Write the full path of the folder, with a backslash at its end."},
    {"folder-slash", "Write backslashes instead of slashes, and one at the end."},
    {"hangs", "Remove the library and tell its author, or allow more time with --timeout."},
    {"hidden", "Merge the two provider elements, or put the more special one first."},
    {"incomplete-prompt", "Add the element, or remove the prompt."},
    {"isolated-library-fails", "Correct what it says, and register the library again."},
    {"malformed", "Correct the file at this place."},
    {"matches-nothing", "Compare the Name with the names that orvix providers lists."},
    {"missing-dependency", "Install the needed library; for an MSSCCI library, name its folder in MSSCCDllSearchPath."},
    {"missing-export", "Remove the file when it is no provider, otherwise tell its author."},
    {"name-not-first", "Put Name first."},
    {"name-too-long", "Register the library with a shorter name."},
    {"no-executable", "Write the full path of the program."},
    {"no-file", "Write the file only when the defaults do not suit you; --config names another folder."},
    {"no-folder", "Make the folder, or name another one with --plugins."},
    {"no-key", "Register the library again."},
    {"no-library", "Register the library again, or set MSSCCDllFullPath."},
    {"no-list", "Register a library with orvix register when you need one."},
    {"no-name", "Add a Name."},
    {"no-path-folder", "Register the library again with its full path."},
    {"no-root", "Name the root element as the text says."},
    {"no-root-folder", "Write the full path of a folder that exists."},
    {"no-search-folder", "Write the full path of a folder that exists."},
    {"no-search-path", "Write the full path of a folder that exists."},
    {"no-server-name", "Register the library again."},
    {"no-server-path", "Register the library again."},
    {"no-text", "Remove the data type from the element."},
    {"no-xml-service", "Repair Windows, which contains the service."},
    {"not-a-library", "Remove it from the plug-in folder."},
    {"not-a-number", "Write a decimal number."},
    {"not-a-string", "Register the library again."},
    {"not-offered", "Tell the author of the library when you need what fails."},
    {"only-32-bit", "Run orvix register PATH NAME --isolated, or install the 64-bit version."},
    {"other-machine", "Get the 64-bit version."},
    {"other-root", "Nothing needs to be done; OrvixPrompts is the usual name."},
    {"path-too-long", "Move the folder, or shorten the name."},
    {"relative-folder", "Give the host the full path of the folder."},
    {"repeated", "Remove all but one."},
    {"root-not-second", "Remove what is between the declaration and the root, or add the declaration."},
    {"setting-cut", "Write a shorter path."},
    {"switched-off", "Set Enabled to true, or remove it, to use the provider."},
    {"text-cut", "Shorten the text."},
    {"text-too-long", "Shorten the text."},
    {"throws", "Tell the author of the plug-in."},
    {"too-large", "Shorten the file."},
    {"unknown-element", "Correct the name, or remove the element."},
    {"unknown-value", "Write one of the two values."},
    {"unreadable-file", "Look at the rights on the file, and at programs that keep it open."},
    {"unreadable-key", "Look at the rights on the key."},
};

} // namespace

std::string_view RemedyFor(std::string_view code)
{
    const auto* const found = std::find_if(std::begin(Remedies), std::end(Remedies),
                                           [code](const auto& remedy) { return remedy.code == code; });
    return found != std::end(Remedies) ? found->remedy : std::string_view();
}
