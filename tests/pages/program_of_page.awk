# Makes one program of a page: its `cpp` blocks, in the order of the page, are the body of main(), after the #include lines.
# The `text` blocks of the page are what that program prints.  Errors of the compiler point into the page.
#
#     awk -v source=page.cpp -v expected=page.txt -f program_of_page.awk page.md

/^```/ {
    language = inside ? "" : substr($0, 4)
    inside = !inside
    if (inside && language == "cpp")
        body = body "#line " FNR + 1 " \"" FILENAME "\"\n"
    next
}
language == "text" { output = output $0 "\n" }
language == "cpp" && /^#include / { includes = includes $0 "\n"; body = body "\n"; next }
language == "cpp" { body = body $0 "\n" }

END {
    printf "%s\nint main() {\n%s}\n", includes, body >source
    printf "%s", output >expected
}
