#pragma once

#include "ValidationSubject.h"

// The checks of the rules in the table of `ValidationRule::All`. Each throws as `ValidationRule::check` does.

/// For every provider, as a host uses it.
namespace ProviderRules
{

void Loads(ValidationSubject& subject);
void Starts(ValidationSubject& subject);
void State(ValidationSubject& subject);
void Reserved(ValidationSubject& subject);
void Results(ValidationSubject& subject);
void BadInput(ValidationSubject& subject);
void EmptyList(ValidationSubject& subject);
void ListUntouched(ValidationSubject& subject);
void Sessions(ValidationSubject& subject);
void Reload(ValidationSubject& subject);
void Handles(ValidationSubject& subject);
void Dialogs(ValidationSubject& subject);

} // namespace ProviderRules

/// For the `QueryStatus` of every provider.
namespace StatusRules
{

void Bits(ValidationSubject& subject);
void Failure(ValidationSubject& subject);
void Closed(ValidationSubject& subject);

} // namespace StatusRules

/// Whether a provider does its work, on a scratch project.
namespace WorkRules
{

void Stores(ValidationSubject& subject);
void ChecksOut(ValidationSubject& subject);
void StatusTruth(ValidationSubject& subject);
void Failures(ValidationSubject& subject);

} // namespace WorkRules

/// What a provider does to the process of its host.
namespace ProcessRules
{

void State(ValidationSubject& subject);
void Memory(ValidationSubject& subject);

} // namespace ProcessRules

/// For the four functions of a plug-in.
namespace PluginRules
{

void Exports(ValidationSubject& subject);
void Version(ValidationSubject& subject);
void Name(ValidationSubject& subject);
void Objects(ValidationSubject& subject);

} // namespace PluginRules

/// For the functions of an MSSCCI library.
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
