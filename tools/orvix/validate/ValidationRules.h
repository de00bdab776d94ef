#pragma once

#include "ValidationSubject.h"

/// What the rules demand, each by the name that it has in the table of `ValidationRule::All`. All throw as
/// `ValidationRule::check` does.

/// Of every provider, as a host meets it.
namespace ProviderRules
{

void Loads(ValidationSubject& subject);
void Starts(ValidationSubject& subject);
void State(ValidationSubject& subject);
void Reserved(ValidationSubject& subject);
void Results(ValidationSubject& subject);
void BadInput(ValidationSubject& subject);
void EmptyList(ValidationSubject& subject);
void StatusBits(ValidationSubject& subject);
void StatusFailure(ValidationSubject& subject);
void StatusClosed(ValidationSubject& subject);
void ListUntouched(ValidationSubject& subject);
void Sessions(ValidationSubject& subject);
void Reload(ValidationSubject& subject);
void Handles(ValidationSubject& subject);
void Dialogs(ValidationSubject& subject);

} // namespace ProviderRules

/// Of a plug-in's four functions.
namespace PluginRules
{

void Exports(ValidationSubject& subject);
void Version(ValidationSubject& subject);
void Name(ValidationSubject& subject);
void Objects(ValidationSubject& subject);

} // namespace PluginRules

/// Of an MSSCCI library's functions.
namespace SccRules
{

void Exports(ValidationSubject& subject);
void Version(ValidationSubject& subject);
void Capabilities(ValidationSubject& subject);
void Texts(ValidationSubject& subject);
void Codes(ValidationSubject& subject);
void NullArguments(ValidationSubject& subject);
void InputTexts(ValidationSubject& subject);
void InfoBits(ValidationSubject& subject);
void TextOutput(ValidationSubject& subject);

} // namespace SccRules
