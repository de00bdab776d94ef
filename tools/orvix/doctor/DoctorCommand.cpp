#include "DoctorCommand.h"

#include "CommandOutput.h"
#include "Doctor.h"

ExitCode RunDoctor(const CommandLine& commandLine)
{
    return WithOutput(commandLine, [&](CommandOutput& output) {
        const DoctorReport report = Doctor::Examine(commandLine, output.Results());
        if (commandLine.json)
        {
            report.PrintJson(output.Stream());
        }
        else
        {
            report.PrintText(output.Stream(), output.Style());
        }
        return report.NumProblems() == 0 ? ExitCode::Success : ExitCode::Failed;
    });
}
