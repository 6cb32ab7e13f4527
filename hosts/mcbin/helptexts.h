#ifndef MCBIN_HELPTEXTS_H
#define MCBIN_HELPTEXTS_H

// The longer texts of the help and the manual page.

inline constexpr const char* kData = "A delimited text file whose first line names the columns; - for standard input";

inline constexpr const char* kSupervisedExamples = R"(Examples:
  mcbin supervised iris.csv --target species
  mcbin supervised people.csv --target income --weight weight --missing-text '?' --report people.html
  mcbin supervised loans.csv --target default --format json > bins.json
  mcbin supervised survey.csv --pairs 'age:bought,income:bought,age:returned' --missing age=-9:-1

A numeric target is cut into bins, whose numbers are its categories then:
  mcbin equal-frequency cars.csv --attributes price --n-bins 4 --format json > price.json
  mcbin apply price.json cars.csv | mcbin supervised - --target price_bin --exclude price)";

inline constexpr const char* kEqualFrequencyExamples = R"(Examples:
  mcbin equal-frequency iris.csv --n-bins 4
  zcat big.csv.gz | mcbin equal-frequency - --attributes 'amount_*' --n-bins 20 --format sql)";

inline constexpr const char* kShowExamples = R"(Examples:
  mcbin supervised loans.csv --target default --format json > bins.json
  mcbin show bins.json
  mcbin show bins.json --format html > bins.html
  mcbin show bins.json --format sql --dialect duckdb --labels)";

inline constexpr const char* kEvaluateExamples = R"(Examples:
  mcbin supervised loans.csv --target default --format json > bins.json
  mcbin evaluate bins.json loans_of_this_year.csv --report drift.html
  mcbin evaluate bins.json loans_of_this_year.csv --strict --format json > drift.json
  mcbin evaluate loans.csv --cuts age=18,25,40 --target default --save bins.json)";

inline constexpr const char* kApplyExamples = R"(Examples:
  mcbin supervised train.csv --target bought --format json > bins.json
  mcbin apply bins.json new.csv -o new_binned.csv
  mcbin apply bins.json new.csv --labels --in-place-columns | head)";

inline constexpr const char* kExitCodes = R"(Exit codes:
  0    done
  1    failure: a file, a row or the data cannot be used, or the output cannot be written
  2    the command line is wrong
  3    with --strict: done, but an attribute carries a warning or an error, or its population has moved
  130  interrupted; what was found before that has been printed, and no file is written)";

#endif
