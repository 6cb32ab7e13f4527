#include "hosts/mcbin/output/page.h"

#include "hosts/mcbin/output/pagestyle.h"
#include "hosts/mcbin/text.h"

#include <filesystem>
#include <ostream>

void BeginPage(std::ostream& os, const std::string& title)
{
    os << "<!DOCTYPE html>\n<html lang=\"en\">\n<head>\n<meta charset=\"utf-8\">\n"
          "<meta name=\"viewport\" content=\"width=device-width, initial-scale=1\">\n"
          "<meta name=\"color-scheme\" content=\"light dark\">\n<title>"
       << title << "</title>\n<style>" << kPageStyle << "</style>\n</head>\n<body>\n<h1>" << title << "</h1>\n";
}

void EndPage(std::ostream& os)
{
    os << "</body>\n</html>\n";
}

std::string MakeHtmlHeading(const AttributeBins& bins)
{
    const std::string name = EscapeHtml(bins.attribute->name);
    return bins.target ? name + " <small>by " + EscapeHtml(bins.target->name) + "</small>" : name;
}

std::string MakeDataTitle(const Bins& bins)
{
    return EscapeHtml(std::filesystem::path(bins.dataName.value_or("")).filename().string());
}
