#pragma once

#include <string>
#include <vector>

/// Gives up for good what this process doesn't need to read a model: it can start no program, process or thread, open
/// no socket, write, make, rename or remove no file, load no further code, and open only what lies below the folders
/// `readable` (those that don't exist are passed over). Files that are open stay so.
///
/// Gives a sentence for each right that the kernel had no means to take; empty when all are gone. To be called before
/// the first byte of a foreign file is parsed, with every library loaded that will be needed.
///
///     Confine({"/models/Car", "/library"});
///     open("/etc/passwd", O_RDONLY); // -1, EACCES
///     socket(AF_INET, SOCK_STREAM, 0); // -1, EPERM
std::vector<std::string> Confine(const std::vector<std::string>& readable);
