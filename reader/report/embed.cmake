# cmake -D OUTPUT=FILE -D CHART_LIBRARY=FILE -P embed.cmake
#
# Writes the strings of assets.h. The names of files are no part of the result.
set(here ${CMAKE_CURRENT_LIST_DIR})
set(text "#include \"reader/report/assets.h\"\n\nnamespace reader::assets {\n")

# embed(NAME FILE): the file's content becomes the string NAME.
function(embed name file)
    file(READ ${file} content)
    if(file MATCHES "[.]js$" AND content MATCHES "</[sS][cC][rR][iI][pP][tT]|<!--")
        message(FATAL_ERROR "${file}: the page's script would end inside it")
    endif()
    string(FIND "${content}" ")asset\"" end)
    if(NOT end EQUAL -1)
        message(FATAL_ERROR "${file}: the string would end inside it")
    endif()
    set(text "${text}\nconst std::string_view ${name} = R\"asset(${content})asset\";\n" PARENT_SCOPE)
endfunction()

embed(page ${here}/page.html)
embed(style ${here}/page.css)
embed(tablesScript ${here}/tables.js)
embed(chartsScript ${here}/charts.js)
embed(chartLibrary ${CHART_LIBRARY})
embed(chartLicence ${here}/chart-licence.txt)
file(WRITE ${OUTPUT} "${text}\n}  // namespace reader::assets\n")
