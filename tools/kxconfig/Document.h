#ifndef KX_TOOLS_DOCUMENT_H
#define KX_TOOLS_DOCUMENT_H

#include <string>

/** Prints "kxconfig: " and @p message as one line on standard error. */
void Complain(const std::string& message);

/** Keeps the engine from printing its complaints, so that WhyNotLoaded() can tell the first. */
void CollectEngineComplaints();

/** @return one line that says why the engine made no document of the file at @p path. */
std::string WhyNotLoaded(const std::string& path);

/** @return the name of the root element of @p document (an xmlDocPtr), or an empty string. */
std::string RootName(const void* document);

/** @return the part of @p key that names the root element. */
std::string RootNameOf(const std::string& key);

#endif
